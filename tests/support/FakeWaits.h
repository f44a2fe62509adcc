// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <errno.h>
#include <pthread.h>
#include <time.h>
#include <unistd.h>

#include <functional>
#include <mutex>
#include <vector>

#include "binder/Waiting.h"

namespace pemaro::test {

/// Leaves the processor to another thread of the test, where other programs compete for it as well: a
/// thread that merely yields waits for all of these each time. It orders nothing that a race detector
/// could take for the order of the two threads.
inline void standAside() {
    usleep(1);
}

/// While one lives the library's waits return at once: a wait on a condition as if its time were
/// over, a sleep as if it had been slept. What they were asked for is kept.
/// Only one may live at a time.
class FakeWaits {
  public:
    FakeWaits();
    ~FakeWaits();
    FakeWaits(const FakeWaits&) = delete;
    FakeWaits& operator=(const FakeWaits&) = delete;

    /// Called in place of each wait on a condition with its number, counted from 1.
    void onWait(std::function<void(int number)> hook);

    /// What each wait on a condition returns; ETIMEDOUT until set.
    void setWaitResult(int result);

    /// Called in place of each sleep with its number, counted from 1.
    void onSleep(std::function<void(int number)> hook);

    std::vector<timespec> deadlines() const;
    std::vector<useconds_t> sleeps() const;

  private:
    static int condTimedWait(pthread_cond_t* cond, pthread_mutex_t* mutex,
                             const timespec* deadline);
    static int sleepMicros(useconds_t micros);

    const WaitHooks mReal;
    mutable std::mutex mLock;
    std::function<void(int number)> mWaitHook;
    std::function<void(int number)> mSleepHook;
    int mWaitResult = ETIMEDOUT;
    std::vector<timespec> mDeadlines;
    std::vector<useconds_t> mSleeps;
};

}  // namespace pemaro::test
