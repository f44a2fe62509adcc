// SPDX-License-Identifier: Apache-2.0
#include "tests/support/FakeWaits.h"

#include <cerrno>
#include <utility>

namespace pemaro::test {

namespace {

FakeWaits* gWaits = nullptr;

}  // namespace

FakeWaits::FakeWaits() : mReal(waitHooks()) {
    gWaits = this;
    waitHooks() = {condTimedWait, sleepMicros};
}

FakeWaits::~FakeWaits() {
    waitHooks() = mReal;
    gWaits = nullptr;
}

void FakeWaits::onWait(std::function<void(int)> hook) {
    mWaitHook = std::move(hook);
}

void FakeWaits::onSleep(std::function<void(int)> hook) {
    mSleepHook = std::move(hook);
}

void FakeWaits::setWaitResult(int result) {
    std::lock_guard<std::mutex> lock(mLock);
    mWaitResult = result;
}

std::vector<timespec> FakeWaits::deadlines() const {
    std::lock_guard<std::mutex> lock(mLock);
    return mDeadlines;
}

std::vector<useconds_t> FakeWaits::sleeps() const {
    std::lock_guard<std::mutex> lock(mLock);
    return mSleeps;
}

int FakeWaits::condTimedWait(pthread_cond_t*, pthread_mutex_t*, const timespec* deadline) {
    FakeWaits& waits = *gWaits;
    int number;
    int result;
    {
        std::lock_guard<std::mutex> lock(waits.mLock);
        waits.mDeadlines.push_back(*deadline);
        number = static_cast<int>(waits.mDeadlines.size());
        result = waits.mWaitResult;
    }
    if (waits.mWaitHook) {
        waits.mWaitHook(number);
    }
    return result;
}

int FakeWaits::sleepMicros(useconds_t micros) {
    FakeWaits& waits = *gWaits;
    int number;
    {
        std::lock_guard<std::mutex> lock(waits.mLock);
        waits.mSleeps.push_back(micros);
        number = static_cast<int>(waits.mSleeps.size());
    }
    if (waits.mSleepHook) {
        waits.mSleepHook(number);
    }
    return 0;
}

}  // namespace pemaro::test
