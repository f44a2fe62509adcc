// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "pemaro/Binder.h"

#include <cstdint>
#include <functional>
#include <memory>
#include <mutex>
#include <string>
#include <vector>

#include "simulator/managers/Subscriber.h"

namespace pemaro::simulator {

/// The subscribers of a manager. A subscriber is its callback binder, however often it subscribes;
/// one whose process dies is forgotten. Any thread may call.
class SubscriberList : public android::IBinder::DeathRecipient {
  public:
    struct Counts : Subscriber::Counts {
        size_t subscribers = 0;  ///< now; the rest is about those that left as well
        uint64_t published = 0;
    };

    /// `narrate` may be null; it is told a line about each that comes and goes.
    SubscriberList(const char* service, size_t queueLimit,
                   std::function<void(const std::string&)> narrate);

    /// Subscribing again changes nothing and is no error.
    int add(const android::sp<android::IBinder>& handle, Subscriber::Deliver deliver);
    int remove(const android::sp<android::IBinder>& handle);

    /// Queues a record for each subscriber.
    void publish(const Subscriber::Record& record);

    Counts counts() const;

    /// Forgets all, and waits a moment for the calls under way.
    void clear();

    void binderDied(const android::wp<android::IBinder>& who) override;

  private:
    using Subscribers = std::vector<std::shared_ptr<Subscriber>>;

    Subscribers::iterator find(const android::IBinder* handle);
    void forget(Subscribers::iterator subscriber, const char* what);
    void narrate(const char* what) const;

    const char* const mService;
    const size_t mQueueLimit;
    const std::function<void(const std::string&)> mNarrate;

    mutable std::mutex mLock;
    Subscribers mSubscribers;
    Subscribers mLeft;  ///< with a thread that may still be in its last call
    Counts mPast;
};

}  // namespace pemaro::simulator
