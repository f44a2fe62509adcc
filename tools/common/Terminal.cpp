// SPDX-License-Identifier: Apache-2.0
#include "tools/common/Terminal.h"

#include <sys/ioctl.h>
#include <unistd.h>

#include <algorithm>
#include <cstdlib>

namespace pemaro::tools {
namespace {

/// How many bytes the character has that begins so; 1 where it is no UTF-8.
size_t bytesOfCharacter(unsigned char first) {
    if (first < 0xC0) {
        return 1;
    }
    return first < 0xE0 ? 2 : first < 0xF0 ? 3 : 4;
}

}  // namespace

bool canBeDrawnOn(const std::string& term) {
    return !term.empty() && term != "dumb";
}

bool isTerminal(int fd) {
    const char* term = getenv("TERM");
    return term != nullptr && canBeDrawnOn(term) && isatty(fd) != 0;
}

TerminalSize terminalSize(int fd) {
    winsize size{};
    if (ioctl(fd, TIOCGWINSZ, &size) == 0 && size.ws_col > 0 && size.ws_row > 0) {
        return {size.ws_col, size.ws_row};
    }
    return {};
}

std::string cutToColumns(const std::string& text, int columns) {
    size_t end = 0;
    for (int used = 0; end < text.size();) {
        const size_t bytes = bytesOfCharacter(static_cast<unsigned char>(text[end]));
        used += bytes < 3 ? 1 : 2;
        if (used > columns) {
            break;
        }
        end += bytes;
    }
    return text.substr(0, std::min(end, text.size()));
}

}  // namespace pemaro::tools
