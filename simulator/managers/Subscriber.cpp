// SPDX-License-Identifier: Apache-2.0
#include "simulator/managers/Subscriber.h"

#include <thread>
#include <utility>

#include "pemaro/Status.h"

namespace pemaro::simulator {

Subscriber::Counts& Subscriber::Counts::operator+=(const Counts& other) {
    delivered += other.delivered;
    dropped += other.dropped;
    failed += other.failed;
    return *this;
}

std::shared_ptr<Subscriber> Subscriber::start(const android::sp<android::IBinder>& handle,
                                              Deliver deliver, size_t queueLimit) {
    std::shared_ptr<Subscriber> subscriber(new Subscriber(handle, std::move(deliver), queueLimit));
    // Detached, since whoever ends it may be in a call that this very thread serves.
    std::thread([subscriber] { subscriber->run(); }).detach();
    return subscriber;
}

Subscriber::Subscriber(const android::sp<android::IBinder>& handle, Deliver deliver,
                       size_t queueLimit)
        : mHandle(handle), mDeliver(std::move(deliver)), mQueueLimit(queueLimit) {}

void Subscriber::put(Record record) {
    std::lock_guard<std::mutex> guard(mLock);
    if (mStopping) {
        return;
    }
    if (mQueue.size() == mQueueLimit) {
        mQueue.pop_front();
        mCounts.dropped += 1;
    }
    mQueue.push_back(std::move(record));
    mChanged.notify_all();
}

void Subscriber::stop() {
    std::lock_guard<std::mutex> guard(mLock);
    mStopping = true;
    mQueue.clear();
    mChanged.notify_all();
}

bool Subscriber::waitUntilStopped(std::chrono::steady_clock::time_point deadline) {
    std::unique_lock<std::mutex> guard(mLock);
    return mChanged.wait_until(guard, deadline, [this] { return mStopped; });
}

bool Subscriber::hasStopped() const {
    std::lock_guard<std::mutex> guard(mLock);
    return mStopped;
}

Subscriber::Counts Subscriber::counts() const {
    std::lock_guard<std::mutex> guard(mLock);
    return mCounts;
}

void Subscriber::run() {
    std::unique_lock<std::mutex> guard(mLock);
    for (;;) {
        mChanged.wait(guard, [this] { return mStopping || !mQueue.empty(); });
        if (mStopping) {
            break;
        }
        const Record record = std::move(mQueue.front());
        mQueue.pop_front();
        guard.unlock();
        const int status = mDeliver(record.get());
        guard.lock();
        (status == STATUS_NO_ERROR ? mCounts.delivered : mCounts.failed) += 1;
    }
    mStopped = true;
    mChanged.notify_all();
}

}  // namespace pemaro::simulator
