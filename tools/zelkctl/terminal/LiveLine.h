// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>

namespace pemaro::zelkctl {

/// A line among a command's words that tells how far it is: on a terminal redrawn in place, and
/// otherwise a line of its own each time.
class LiveLine {
  public:
    LiveLine();
    /// Ends the line, so that what follows stands on the next.
    ~LiveLine();

    bool isTerminal() const { return mTerminal; }
    void show(const std::string& text);
    /// The same as destroying it; it can be shown again.
    void end();

  private:
    const bool mTerminal;
    bool mShown = false;
};

}  // namespace pemaro::zelkctl
