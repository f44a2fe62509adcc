// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/terminal/LiveLine.h"

#include <fmt/core.h>
#include <unistd.h>

#include <cstdio>

namespace pemaro::zelkctl {

LiveLine::LiveLine() : mTerminal(isatty(STDOUT_FILENO) != 0) {}

LiveLine::~LiveLine() {
    if (mTerminal && mShown) {
        fmt::print("\n");
    }
    fflush(stdout);
}

void LiveLine::show(const std::string& text) {
    // Back to the first column, and away with what stood there.
    fmt::print(mTerminal ? "\r{}\x1b[K" : "{}\n", text);
    fflush(stdout);
    mShown = true;
}

}  // namespace pemaro::zelkctl
