// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>
#include <vector>

namespace pemaro::zelkctl {

/// The whole terminal on the standard output, to draw on again and again. What stood there comes back
/// when it is let go.
class Screen {
  public:
    Screen();
    ~Screen();
    Screen(const Screen&) = delete;
    Screen& operator=(const Screen&) = delete;

    /// Shows these lines, from the top, and nothing else. No line may be wider than the terminal, and no
    /// more of them than it has rows. False when the terminal is gone.
    bool draw(const std::vector<std::string>& lines);
};

}  // namespace pemaro::zelkctl
