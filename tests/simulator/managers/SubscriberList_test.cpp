// SPDX-License-Identifier: Apache-2.0
// Who is subscribed, and who is told what.

#include "simulator/managers/SubscriberList.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <utils/Errors.h>

#include <atomic>
#include <chrono>
#include <future>
#include <string>
#include <thread>
#include <vector>

#include "pemaro/Status.h"
#include "tests/support/RecordingBinder.h"

using testing::ElementsAre;

namespace pemaro::simulator {

namespace {

using android::sp;
using test::RecordingBinder;

struct SubscriberListTest : testing::Test {
    ~SubscriberListTest() override { list->clear(); }

    // Subscribes a handle whose events are counted.
    int add(const sp<RecordingBinder>& handle) {
        return list->add(handle, [this](const void*) {
            calls += 1;
            return STATUS_NO_ERROR;
        });
    }

    void awaitCalls(int count) {
        for (int i = 0; calls < count && i < 60000; ++i) {
            std::this_thread::sleep_for(std::chrono::milliseconds(1));
        }
        EXPECT_EQ(count, calls);
    }

    std::atomic<int> calls{0};
    std::vector<std::string> story;
    sp<SubscriberList> list = new SubscriberList(
            "touch", 8, [this](const std::string& line) { story.push_back(line); });
    sp<RecordingBinder> first = new RecordingBinder;
    sp<RecordingBinder> second = new RecordingBinder;
};

}  // namespace

TEST_F(SubscriberListTest, TellsEachSubscriberOnce) {
    EXPECT_EQ(0, add(first));
    EXPECT_EQ(0, add(second));
    list->publish(std::make_shared<int>(1));
    awaitCalls(2);
    list->clear();
    const SubscriberList::Counts counts = list->counts();
    EXPECT_EQ(1u, counts.published);
    EXPECT_EQ(2u, counts.delivered);
    EXPECT_EQ(0u, counts.subscribers);
}

TEST_F(SubscriberListTest, SubscribingAgainIsNoErrorAndChangesNothing) {
    EXPECT_EQ(0, add(first));
    EXPECT_EQ(0, add(first));
    EXPECT_EQ(1u, list->counts().subscribers);
    EXPECT_EQ(1u, first->links().size());
    list->publish(std::make_shared<int>(1));
    awaitCalls(1);
    EXPECT_EQ(0, list->remove(first));
    EXPECT_EQ(0u, list->counts().subscribers);
}

TEST_F(SubscriberListTest, LeavingUnlinksAndHappensOnce) {
    add(first);
    EXPECT_EQ(0, list->remove(first));
    EXPECT_EQ(0u, first->links().size());
    EXPECT_EQ(0x40000019, list->remove(first));
    EXPECT_EQ(0x40000019, list->remove(second));
    EXPECT_THAT(story, ElementsAre("touch: a subscriber subscribed, 1 now",
                                   "touch: a subscriber unsubscribed, 0 now"));
}

TEST_F(SubscriberListTest, ForgetsTheDeadAndKeepsTheOthers) {
    add(first);
    add(second);
    first->die();
    EXPECT_EQ(1u, list->counts().subscribers);
    EXPECT_EQ("touch: a subscriber died, 1 now", story.back());
    list->publish(std::make_shared<int>(1));
    awaitCalls(1);
    EXPECT_EQ(0x40000019, list->remove(first));
}

TEST_F(SubscriberListTest, RefusesOneThatIsDead) {
    first->setLinkResult(android::DEAD_OBJECT);
    EXPECT_EQ(0x40000016, add(first));
    EXPECT_EQ(0u, list->counts().subscribers);
}

TEST_F(SubscriberListTest, TakesABinderOfThisProcess) {
    first->setLinkResult(android::INVALID_OPERATION);
    EXPECT_EQ(0, add(first));
    EXPECT_EQ(1u, list->counts().subscribers);
}

TEST_F(SubscriberListTest, OneThatStandsStillHoldsUpNobody) {
    std::promise<void> release;
    std::shared_future<void> released = release.get_future().share();
    ASSERT_EQ(0, list->add(first, [released](const void*) {
        released.wait();
        return STATUS_NO_ERROR;
    }));
    add(second);
    for (int i = 0; i < 20; ++i) {
        list->publish(std::make_shared<int>(i));
        awaitCalls(i + 1);
    }
    EXPECT_LE(11u, list->counts().dropped) << "8 of 20 wait, and one is under way";
    release.set_value();
}

TEST_F(SubscriberListTest, CountsThoseThatLeftAsWell) {
    add(first);
    list->publish(std::make_shared<int>(1));
    awaitCalls(1);
    list->remove(first);
    list->clear();
    EXPECT_EQ(1u, list->counts().delivered);
    add(second);
    list->remove(second);
    EXPECT_EQ(1u, list->counts().delivered);
}

}  // namespace pemaro::simulator
