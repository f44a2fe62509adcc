// SPDX-License-Identifier: Apache-2.0
#include "simulator/managers/SubscriberList.h"

#include <utils/Errors.h>

#include <algorithm>
#include <chrono>
#include <utility>

#include "pemaro/Status.h"

using android::IBinder;
using android::sp;
using android::wp;
using Clock = std::chrono::steady_clock;

namespace pemaro::simulator {
namespace {

/// For a subscriber that stands still, there is no end to wait for.
constexpr auto kClearPatience = std::chrono::seconds(2);

}  // namespace

SubscriberList::SubscriberList(const char* service, size_t queueLimit,
                               std::function<void(const std::string&)> narrate)
        : mService(service), mQueueLimit(queueLimit), mNarrate(std::move(narrate)) {}

int SubscriberList::add(const sp<IBinder>& handle, Subscriber::Deliver deliver) {
    std::lock_guard<std::mutex> guard(mLock);
    if (find(handle.get()) != mSubscribers.end()) {
        return STATUS_NO_ERROR;
    }
    // A binder of this very process cannot die before us, and cannot be linked to.
    if (handle->linkToDeath(this) == android::DEAD_OBJECT) {
        return STATUS_BINDER_DIED;
    }
    mSubscribers.push_back(Subscriber::start(handle, std::move(deliver), mQueueLimit));
    narrate("subscribed");
    return STATUS_NO_ERROR;
}

int SubscriberList::remove(const sp<IBinder>& handle) {
    std::lock_guard<std::mutex> guard(mLock);
    const auto subscriber = find(handle.get());
    if (subscriber == mSubscribers.end()) {
        return STATUS_NOT_FOUND;
    }
    handle->unlinkToDeath(this);
    forget(subscriber, "unsubscribed");
    return STATUS_NO_ERROR;
}

void SubscriberList::binderDied(const wp<IBinder>& who) {
    std::lock_guard<std::mutex> guard(mLock);
    const auto subscriber = find(who.unsafe_get());
    if (subscriber != mSubscribers.end()) {
        forget(subscriber, "died");
    }
}

void SubscriberList::publish(const Subscriber::Record& record) {
    std::lock_guard<std::mutex> guard(mLock);
    mPast.published += 1;
    for (const auto& subscriber : mSubscribers) {
        subscriber->put(record);
    }
}

SubscriberList::Counts SubscriberList::counts() const {
    std::lock_guard<std::mutex> guard(mLock);
    Counts counts = mPast;
    counts.subscribers = mSubscribers.size();
    for (const Subscribers& some : {mSubscribers, mLeft}) {
        for (const auto& subscriber : some) {
            counts += subscriber->counts();
        }
    }
    return counts;
}

void SubscriberList::clear() {
    Subscribers left;
    {
        std::lock_guard<std::mutex> guard(mLock);
        while (!mSubscribers.empty()) {
            mSubscribers.back()->handle()->unlinkToDeath(this);
            forget(mSubscribers.end() - 1, nullptr);
        }
        left = mLeft;
    }
    const auto deadline = Clock::now() + kClearPatience;
    for (const auto& subscriber : left) {
        subscriber->waitUntilStopped(deadline);
    }
}

SubscriberList::Subscribers::iterator SubscriberList::find(const IBinder* handle) {
    return std::find_if(mSubscribers.begin(), mSubscribers.end(), [handle](const auto& candidate) {
        return candidate->handle().get() == handle;
    });
}

void SubscriberList::forget(Subscribers::iterator subscriber, const char* what) {
    (*subscriber)->stop();
    mLeft.push_back(*subscriber);
    mSubscribers.erase(subscriber);
    const auto stopped = [this](const auto& left) {
        const bool ended = left->hasStopped();
        if (ended) {
            mPast += left->counts();
        }
        return ended;
    };
    mLeft.erase(std::remove_if(mLeft.begin(), mLeft.end(), stopped), mLeft.end());
    if (what != nullptr) {
        narrate(what);
    }
}

void SubscriberList::narrate(const char* what) const {
    if (mNarrate) {
        mNarrate(std::string(mService) + ": a subscriber " + what + ", " +
                 std::to_string(mSubscribers.size()) + " now");
    }
}

}  // namespace pemaro::simulator
