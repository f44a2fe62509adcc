// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>

namespace pemaro::tools {

/// A line that tells how far a program is: on a terminal redrawn in place, cut where it would go on in
/// the next line, and otherwise a line of its own each time.
class LiveLine {
  public:
    /// On the standard output or the standard error.
    explicit LiveLine(int fd);
    /// Ends the line, so that what follows stands on the next.
    ~LiveLine();

    bool isTerminal() const { return mTerminal; }
    void show(const std::string& text);
    /// The same as destroying it; it can be shown again.
    void end();
    /// Takes it away from a terminal, so that what follows stands in its place.
    void clear();

  private:
    void draw(const std::string& text) const;

    const int mFd;
    const bool mTerminal;
    bool mShown = false;
};

}  // namespace pemaro::tools
