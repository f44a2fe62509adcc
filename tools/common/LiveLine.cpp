// SPDX-License-Identifier: Apache-2.0
#include "tools/common/LiveLine.h"

#include <unistd.h>

#include "tools/common/StandardOutput.h"
#include "tools/common/Terminal.h"

namespace pemaro::tools {

LiveLine::LiveLine(int fd) : mFd(fd), mTerminal(tools::isTerminal(fd)) {}

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
    if (mTerminal) {
        // Back to the first column, and away with what stood there. A line that reaches the last
        // column may go on in the next, and could not be drawn over any more.
        draw("\r" + cutToColumns(text, terminalSize(mFd).columns - 1) + "\x1b[K");
    } else {
        draw(text + "\n");
    }
    mShown = true;
}

void LiveLine::draw(const std::string& text) const {
    if (mFd == STDOUT_FILENO) {
        writeOutput(text);
    } else {
        // Not worth a word when it fails.
        [[maybe_unused]] const ssize_t written = write(mFd, text.data(), text.size());
    }
}

}  // namespace pemaro::tools
