// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <utils/Timers.h>

namespace pemaro::test {

/// While one lives android::systemTime(SYSTEM_TIME_MONOTONIC) tells the time that the test sets;
/// 0 at first.
class FakeClock {
  public:
    FakeClock();
    ~FakeClock();
    FakeClock(const FakeClock&) = delete;
    FakeClock& operator=(const FakeClock&) = delete;

    void set(nsecs_t now);
};

}  // namespace pemaro::test
