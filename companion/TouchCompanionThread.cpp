// SPDX-License-Identifier: Apache-2.0
#define LOG_TAG "TouchCompanionClient"

#include "companion/TouchCompanionThread.h"

#include <log/log.h>
#include <unistd.h>
#include <utils/Timers.h>

namespace pemaro {

namespace {

// A wait takes 16 ms. One that takes so much longer waits for somebody who is dead.
constexpr nsecs_t kOverdue = ms2ns(1000);

// How often end() looks whether the thread still runs.
constexpr useconds_t kLookMicroseconds = 10000;

// Between passes over a ring that paces nothing by itself.
constexpr useconds_t kPauseMicroseconds = 16000;

}  // namespace

TouchCompanionThread::TouchCompanionThread(const MappedBlock& block,
                                           FrameDelivery::DataCallback callback, void* context,
                                           const android::sp<TouchCompanionThread>& previous)
        : android::Thread(true /* canCallJava */),
          mDelivery(block, callback, context, this),
          mPrevious(previous) {}

bool TouchCompanionThread::end() {
    requestExit();
    if (isSelf()) {
        return false;
    }
    while (isRunning()) {
        if (isOverdue()) {
            ALOGE("the recording thread is left behind: a wait in the shared memory does not "
                  "end");
            return true;
        }
        usleep(kLookMicroseconds);
    }
    requestExitAndWait();
    // One that was told to exit before its first pass has not ended it.
    const android::sp<TouchCompanionThread> before = previous();
    return before == nullptr || before->end();
}

android::sp<TouchCompanionThread> TouchCompanionThread::previous() {
    android::AutoMutex lock(mStateLock);
    return mPrevious;
}

/// Whether this is the thread that calls, or waits for it.
bool TouchCompanionThread::isSelf() {
    {
        android::AutoMutex lock(mStateLock);
        if (mHasSelf && pthread_equal(mSelf, pthread_self()) != 0) {
            return true;
        }
    }
    const android::sp<TouchCompanionThread> before = previous();
    return before != nullptr && before->isSelf();
}

/// Whether its wait is; from then on it is left behind.
bool TouchCompanionThread::isOverdue() {
    android::AutoMutex lock(mStateLock);
    if (mWaitingSince == 0 || systemTime(SYSTEM_TIME_MONOTONIC) - mWaitingSince <= kOverdue) {
        return false;
    }
    mLeftBehind = true;
    return true;
}

bool TouchCompanionThread::threadLoop() {
    {
        android::AutoMutex lock(mStateLock);
        mSelf = pthread_self();
        mHasSelf = true;
    }
    const android::sp<TouchCompanionThread> before = previous();
    if (before != nullptr) {
        before->end();
        android::AutoMutex lock(mStateLock);
        mPrevious.clear();
        if (exitPending()) {
            return false;
        }
    }
    mDelivery.pass(mStatistics);
    if (mDelivery.isStuck()) {
        usleep(kPauseMicroseconds);
    }
    android::AutoMutex lock(mStateLock);
    return !mLeftBehind;
}

void TouchCompanionThread::waitBegins() {
    android::AutoMutex lock(mStateLock);
    mWaitingSince = systemTime(SYSTEM_TIME_MONOTONIC);
}

bool TouchCompanionThread::waitEnded() {
    android::AutoMutex lock(mStateLock);
    mWaitingSince = 0;
    return !mLeftBehind;
}

}  // namespace pemaro
