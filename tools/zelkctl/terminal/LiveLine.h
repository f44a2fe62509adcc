// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>

namespace pemaro::zelkctl {

/// A line that tells how far a command is: on a terminal redrawn in place, and otherwise a line of
/// its own each time.
class LiveLine {
  public:
    /// Among the command's words.
    LiveLine();
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

}  // namespace pemaro::zelkctl
