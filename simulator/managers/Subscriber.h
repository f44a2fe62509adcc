// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "pemaro/Binder.h"

#include <chrono>
#include <condition_variable>
#include <cstdint>
#include <deque>
#include <functional>
#include <memory>
#include <mutex>

namespace pemaro::simulator {

/// One subscriber of a manager: a queue of records and a thread that hands them over, one after
/// another. A callback is a synchronous call into another process, which may take its time, stand
/// still or call back meanwhile; with a thread to each, it is its own events alone that wait.
/// Any thread may call.
class Subscriber : public std::enable_shared_from_this<Subscriber> {
  public:
    using Record = std::shared_ptr<const void>;
    /// Calls the subscriber with a record; returns its status.
    using Deliver = std::function<int(const void* record)>;

    struct Counts {
        uint64_t delivered = 0;
        uint64_t dropped = 0;  ///< gave way to newer ones in a full queue
        uint64_t failed = 0;   ///< handed over, and answered with a status other than 0

        Counts& operator+=(const Counts& other);
    };

    /// Starts the thread. At most `queueLimit` records wait.
    static std::shared_ptr<Subscriber> start(const android::sp<android::IBinder>& handle,
                                             Deliver deliver, size_t queueLimit);

    const android::sp<android::IBinder>& handle() const { return mHandle; }

    /// Never waits: the oldest record gives way when the queue is full.
    void put(Record record);

    /// Asks the thread to end, from whatever thread, and does not wait: a subscriber may leave from
    /// within its own callback. At most the call under way goes on.
    void stop();

    /// Waits for the thread that was asked to end.
    bool waitUntilStopped(std::chrono::steady_clock::time_point deadline);
    bool hasStopped() const;

    Counts counts() const;

  private:
    Subscriber(const android::sp<android::IBinder>& handle, Deliver deliver, size_t queueLimit);

    void run();

    const android::sp<android::IBinder> mHandle;
    const Deliver mDeliver;
    const size_t mQueueLimit;

    mutable std::mutex mLock;
    std::condition_variable mChanged;
    std::deque<Record> mQueue;
    Counts mCounts;
    bool mStopping = false;
    bool mStopped = false;
};

}  // namespace pemaro::simulator
