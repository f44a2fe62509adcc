// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <pthread.h>
#include <utils/Mutex.h>
#include <utils/Thread.h>

#include "companion/FrameDelivery.h"

namespace pemaro {

/// Delivers recorded frames, pass after pass, until it is told to exit; the ring's own wait paces
/// it. It shares nothing with the client that made it and keeps the block mapped by itself, so that
/// it may outlive both: the client may be let go in the callback, and a wait in memory that another
/// process has ruined may never end.
class TouchCompanionThread : public android::Thread, private WaitWatch {
  public:
    /// `previous`, if there is one, is ended before the first pass. It is in its callback, from
    /// within which the next recording was started: so there is never a second callback at a time.
    TouchCompanionThread(const MappedBlock& block, FrameDelivery::DataCallback callback,
                         void* context, const android::sp<TouchCompanionThread>& previous);

    /// Asks the thread to exit and waits until it has: no callback runs afterwards. Two threads are
    /// not waited for: one whose wait in the shared memory is overdue by a second, which is left
    /// behind with what it needs, and which will call nobody; and the calling one, or one that
    /// waits for that to end, for which false is returned: the callback has yet to return.
    bool end();

  private:
    bool threadLoop() override;
    void waitBegins() override;
    bool waitEnded() override;
    android::sp<TouchCompanionThread> previous();
    bool isSelf();
    bool isOverdue();

    FrameDelivery mDelivery;
    FrameStatistics mStatistics;
    android::Mutex mStateLock;
    android::sp<TouchCompanionThread> mPrevious;
    pthread_t mSelf{};
    bool mHasSelf = false;
    int64_t mWaitingSince = 0;  ///< nanoseconds, 0 outside of a wait
    bool mLeftBehind = false;
};

}  // namespace pemaro
