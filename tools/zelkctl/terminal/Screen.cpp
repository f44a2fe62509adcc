// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/terminal/Screen.h"

#include <android-base/file.h>
#include <unistd.h>

namespace pemaro::zelkctl {
namespace {

// The other screen, without a cursor and without going on in the next line at the right edge.
constexpr const char* kEnter = "\x1b[?1049h\x1b[?25l\x1b[?7l\x1b[2J";
constexpr const char* kLeave = "\x1b[?7h\x1b[?25h\x1b[?1049l";
constexpr const char* kHome = "\x1b[H";
constexpr const char* kClearRestOfLine = "\x1b[K";
constexpr const char* kClearBelow = "\x1b[J";

bool write(const std::string& text) {
    return android::base::WriteFully(STDOUT_FILENO, text.data(), text.size());
}

}  // namespace

Screen::Screen() {
    write(kEnter);
}

Screen::~Screen() {
    write(kLeave);
}

bool Screen::draw(const std::vector<std::string>& lines) {
    std::string text = kHome;
    for (size_t i = 0; i < lines.size(); ++i) {
        text += (i == 0 ? "" : "\r\n") + lines[i] + kClearRestOfLine;
    }
    return write(text + kClearBelow);
}

}  // namespace pemaro::zelkctl
