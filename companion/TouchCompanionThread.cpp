// SPDX-License-Identifier: Apache-2.0
#define LOG_TAG "TouchCompanionClient"

#include "companion/TouchCompanionThread.h"

#include <log/log.h>
#include <utils/Timers.h>

namespace pemaro {

namespace {

// A wait takes 16 ms. One that takes so much longer waits for somebody who is dead.
constexpr nsecs_t kOverdue = ms2ns(1000);

// How often end() looks whether the thread still runs where nothing tells it.
constexpr nsecs_t kLook = ms2ns(10);

// Between passes over a ring that paces nothing by itself.
constexpr nsecs_t kPause = ms2ns(16);

}  // namespace

TouchCompanionThread::TouchCompanionThread(const MappedBlock& block,
                                           FrameDelivery::DataCallback callback, void* context)
        : android::Thread(true /* canCallJava */), mDelivery(block, callback, context, this) {}

void TouchCompanionThread::requestExit() {
    android::Thread::requestExit();
    android::AutoMutex lock(mStateLock);
    mStateChanged.broadcast();
}

void TouchCompanionThread::end() {
    requestExit();
    {
        android::AutoMutex lock(mStateLock);
        if (mHasSelf && pthread_equal(mSelf, pthread_self()) != 0) {
            return;
        }
        while (isRunning()) {
            if (mWaitingSince != 0 &&
                systemTime(SYSTEM_TIME_MONOTONIC) - mWaitingSince > kOverdue) {
                mLeftBehind = true;
                ALOGE("the recording thread is left behind: a wait in the shared memory does not "
                      "end");
                return;
            }
            mStateChanged.waitRelative(mStateLock, kLook);
        }
    }
    requestExitAndWait();
}

bool TouchCompanionThread::threadLoop() {
    {
        android::AutoMutex lock(mStateLock);
        mSelf = pthread_self();
        mHasSelf = true;
    }
    mDelivery.pass(mStatistics);
    android::AutoMutex lock(mStateLock);
    if (mDelivery.isStuck() && !exitPending()) {
        mStateChanged.waitRelative(mStateLock, kPause);
    }
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
