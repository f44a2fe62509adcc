// SPDX-License-Identifier: Apache-2.0
#include "tests/support/FakeClock.h"

#include <time.h>

#include <atomic>

namespace pemaro::test {

namespace {

std::atomic<bool> gFaked{false};
std::atomic<nsecs_t> gNow{0};

}  // namespace

FakeClock::FakeClock() {
    gNow = 0;
    gFaked = true;
}

FakeClock::~FakeClock() {
    gFaked = false;
}

void FakeClock::set(nsecs_t now) {
    gNow = now;
}

}  // namespace pemaro::test

// Takes the place of libutils'.
nsecs_t systemTime(int clock) {
    if (clock == SYSTEM_TIME_MONOTONIC && pemaro::test::gFaked) {
        return pemaro::test::gNow;
    }
    static const clockid_t kClocks[] = {CLOCK_REALTIME, CLOCK_MONOTONIC, CLOCK_PROCESS_CPUTIME_ID,
                                        CLOCK_THREAD_CPUTIME_ID, CLOCK_BOOTTIME};
    timespec now;
    clock_gettime(kClocks[clock], &now);
    return nsecs_t{now.tv_sec} * 1000000000 + now.tv_nsec;
}
