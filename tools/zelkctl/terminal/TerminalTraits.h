// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <functional>

namespace pemaro::zelkctl {

enum class Colors { kNone, k256, kTrue };

/// What the place can show that the output goes to.
struct TerminalTraits {
    bool isTerminal = false;
    Colors colors = Colors::kNone;
    bool unicode = false;
    int columns = 80;
    int rows = 24;
};

/// Of the standard output, as the environment and the terminal tell. The size is that of now.
TerminalTraits terminalTraits();

/// What these variables of the environment tell of a terminal: NO_COLOR, TERM, COLORTERM, and LC_ALL,
/// LC_CTYPE and LANG. `variable` returns null for one that is not set.
Colors colorsOf(const std::function<const char*(const char*)>& variable);
bool isUnicode(const std::function<const char*(const char*)>& variable);

}  // namespace pemaro::zelkctl
