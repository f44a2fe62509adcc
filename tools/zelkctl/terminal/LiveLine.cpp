// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/terminal/LiveLine.h"

#include <unistd.h>

#include "tools/common/StandardOutput.h"
#include "tools/zelkctl/terminal/Output.h"

namespace pemaro::zelkctl {
namespace {

void draw(const std::string& text) {
    if (wordsDescriptor() == STDOUT_FILENO) {
        tools::writeOutput(text);
    } else {
        // Not worth a word when it fails.
        [[maybe_unused]] const ssize_t written = write(STDERR_FILENO, text.data(), text.size());
    }
}

}  // namespace

LiveLine::LiveLine() : mTerminal(isatty(wordsDescriptor()) != 0) {}

LiveLine::~LiveLine() {
    end();
}

void LiveLine::end() {
    if (mTerminal && mShown) {
        draw("\n");
    }
    mShown = false;
}

void LiveLine::show(const std::string& text) {
    // Back to the first column, and away with what stood there.
    draw(mTerminal ? "\r" + text + "\x1b[K" : text + "\n");
    mShown = true;
}

}  // namespace pemaro::zelkctl
