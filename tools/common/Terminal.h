// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>

namespace pemaro::tools {

struct TerminalSize {
    int columns = 80;
    int rows = 24;
};

/// Whether there is a terminal that can be drawn on: one that TERM names, and that is not dumb. What
/// draws on no other writes to a dumb one as it does to a file.
bool isTerminal(int fd);

/// Whether TERM, with this value, names a terminal that understands more than lines.
bool canBeDrawnOn(const std::string& term);

/// The size of now; the usual one of a terminal that does not tell it.
TerminalSize terminalSize(int fd);

/// As much of a text of one line as fits into these columns, without a part of a character. Only its
/// bytes tell how wide a character of UTF-8 is, so that one of three bytes or more counts as wide.
std::string cutToColumns(const std::string& text, int columns);

}  // namespace pemaro::tools
