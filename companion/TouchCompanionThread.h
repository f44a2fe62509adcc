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
    TouchCompanionThread(const MappedBlock& block, FrameDelivery::DataCallback callback,
                         void* context);

    /// Asks the thread to exit and waits until it has: no callback runs afterwards. Two threads are
    /// not waited for: the calling one, which ends when its callback returns, and one whose wait in
    /// the shared memory is overdue by a second, which is left behind with what it needs, and which
    /// will call nobody.
    void end();

  private:
    bool threadLoop() override;
    void waitBegins() override;
    bool waitEnded() override;
    bool isSelf();
    bool isOverdue();

    FrameDelivery mDelivery;
    FrameStatistics mStatistics;
    android::Mutex mStateLock;
    pthread_t mSelf{};
    bool mHasSelf = false;
    int64_t mWaitingSince = 0;  ///< nanoseconds, 0 outside of a wait
    bool mLeftBehind = false;
};

}  // namespace pemaro
