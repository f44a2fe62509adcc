// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/terminal/StopSignal.h"

#include <signal.h>

#include <atomic>

namespace pemaro::zelkctl {
namespace {

std::atomic<bool> gCaught{false};

void note(int) {
    gCaught = true;
}

void handle(void (*handler)(int), int flags) {
    struct sigaction action {};
    action.sa_handler = handler;
    action.sa_flags = flags;
    sigaction(SIGINT, &action, nullptr);
    sigaction(SIGTERM, &action, nullptr);
}

}  // namespace

StopSignal::StopSignal() {
    gCaught = false;
    handle(note, static_cast<int>(SA_RESTART | SA_RESETHAND));
}

StopSignal::~StopSignal() {
    handle(SIG_DFL, 0);
}

bool StopSignal::caught() const {
    return gCaught;
}

}  // namespace pemaro::zelkctl
