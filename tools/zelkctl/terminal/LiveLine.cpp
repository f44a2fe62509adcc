// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/terminal/LiveLine.h"

#include <unistd.h>

#include "tools/common/StandardOutput.h"
#include "tools/zelkctl/terminal/Output.h"

namespace pemaro::zelkctl {

LiveLine::LiveLine() : LiveLine(wordsDescriptor()) {}

LiveLine::LiveLine(int fd) : mFd(fd), mTerminal(isatty(fd) != 0) {}

LiveLine::~LiveLine() {
    end();
}

void LiveLine::end() {
    if (mTerminal && mShown) {
        draw("\n");
    }
    mShown = false;
}

void LiveLine::clear() {
    if (mTerminal && mShown) {
        draw("\r\x1b[K");
    }
    mShown = false;
}

void LiveLine::show(const std::string& text) {
    // Back to the first column, and away with what stood there.
    draw(mTerminal ? "\r" + text + "\x1b[K" : text + "\n");
    mShown = true;
}

void LiveLine::draw(const std::string& text) const {
    if (mFd == STDOUT_FILENO) {
        tools::writeOutput(text);
    } else {
        // Not worth a word when it fails.
        [[maybe_unused]] const ssize_t written = write(mFd, text.data(), text.size());
    }
}

}  // namespace pemaro::zelkctl
