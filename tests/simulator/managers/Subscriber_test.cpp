// SPDX-License-Identifier: Apache-2.0
// A subscriber's queue and thread.

#include "simulator/managers/Subscriber.h"

#include <gtest/gtest.h>

#include <atomic>
#include <future>
#include <vector>

#include "pemaro/Status.h"
#include "tests/support/RecordingBinder.h"

namespace pemaro::simulator {

namespace {

using Clock = std::chrono::steady_clock;
using android::sp;

Clock::time_point soon() {
    return Clock::now() + std::chrono::seconds(60);
}

Subscriber::Record number(int value) {
    return std::make_shared<int>(value);
}

int valueOf(const void* record) {
    return *static_cast<const int*>(record);
}

// Holds its subscriber's calls until it is opened.
class Gate {
  public:
    // Returns when a call has come in.
    void awaitCaller() { mEntered.get_future().wait(); }
    void open() { mOpen.set_value(); }
    void pass() {
        if (!mPassed.exchange(true)) {
            mEntered.set_value();
            mOpen.get_future().wait();
        }
    }

  private:
    std::atomic<bool> mPassed{false};
    std::promise<void> mEntered;
    std::promise<void> mOpen;
};

std::shared_ptr<Subscriber> start(Subscriber::Deliver deliver, size_t queueLimit = 8) {
    return Subscriber::start(new test::RecordingBinder, std::move(deliver), queueLimit);
}

}  // namespace

TEST(Subscriber, ReceivesRecordsInOrder) {
    std::vector<int> received;
    std::promise<void> done;
    auto subscriber = start([&](const void* record) {
        received.push_back(valueOf(record));
        if (received.size() == 3) {
            done.set_value();
        }
        return STATUS_NO_ERROR;
    });
    for (int value : {1, 2, 3}) {
        subscriber->put(number(value));
    }
    done.get_future().wait();
    subscriber->stop();
    ASSERT_TRUE(subscriber->waitUntilStopped(soon()));
    EXPECT_EQ((std::vector<int>{1, 2, 3}), received);
    EXPECT_EQ(3u, subscriber->counts().delivered);
    EXPECT_EQ(0u, subscriber->counts().dropped);
    EXPECT_EQ(0u, subscriber->counts().failed);
}

TEST(Subscriber, DropsTheOldestOfAFullQueueAndCountsIt) {
    Gate gate;
    std::vector<int> received;
    std::promise<void> done;
    auto subscriber = start(
            [&](const void* record) {
                gate.pass();
                received.push_back(valueOf(record));
                if (valueOf(record) == 5) {
                    done.set_value();
                }
                return STATUS_NO_ERROR;
            },
            2);
    subscriber->put(number(1));
    gate.awaitCaller();
    for (int value : {2, 3, 4, 5}) {
        subscriber->put(number(value));
    }
    EXPECT_EQ(2u, subscriber->counts().dropped);
    gate.open();
    done.get_future().wait();
    subscriber->stop();
    ASSERT_TRUE(subscriber->waitUntilStopped(soon()));
    EXPECT_EQ((std::vector<int>{1, 4, 5}), received);
}

TEST(Subscriber, CountsWhatWasAnsweredWithAnError) {
    std::promise<void> called;
    auto subscriber = start([&](const void*) {
        called.set_value();
        return STATUS_UNKNOWN_ERROR;
    });
    subscriber->put(number(1));
    called.get_future().wait();
    subscriber->stop();
    ASSERT_TRUE(subscriber->waitUntilStopped(soon()));
    EXPECT_EQ(1u, subscriber->counts().failed);
    EXPECT_EQ(0u, subscriber->counts().delivered);
}

TEST(Subscriber, StopNeverWaitsForTheCallUnderWay) {
    Gate gate;
    auto subscriber = start([&](const void*) {
        gate.pass();
        return STATUS_NO_ERROR;
    });
    subscriber->put(number(1));
    subscriber->put(number(2));
    gate.awaitCaller();
    subscriber->stop();
    subscriber->stop();
    EXPECT_FALSE(subscriber->hasStopped());
    EXPECT_FALSE(subscriber->waitUntilStopped(Clock::now()));
    gate.open();
    EXPECT_TRUE(subscriber->waitUntilStopped(soon()));
    EXPECT_TRUE(subscriber->hasStopped());
    EXPECT_EQ(1u, subscriber->counts().delivered) << "the second was still queued";
}

TEST(Subscriber, CanBeStoppedFromWithinItsOwnCall) {
    std::shared_ptr<Subscriber> subscriber;
    std::promise<void> ready;
    subscriber = start([&](const void*) {
        ready.get_future().wait();
        subscriber->stop();
        return STATUS_NO_ERROR;
    });
    subscriber->put(number(1));
    ready.set_value();
    EXPECT_TRUE(subscriber->waitUntilStopped(soon()));
}

TEST(Subscriber, TakesNothingOnceStopped) {
    auto subscriber = start([](const void*) { return STATUS_NO_ERROR; });
    subscriber->stop();
    ASSERT_TRUE(subscriber->waitUntilStopped(soon()));
    subscriber->put(number(1));
    EXPECT_EQ(0u, subscriber->counts().delivered);
    EXPECT_EQ(0u, subscriber->counts().dropped);
}

}  // namespace pemaro::simulator
