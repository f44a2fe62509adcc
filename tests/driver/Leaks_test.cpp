// SPDX-License-Identifier: Apache-2.0
// Recordings, over and over, use up nothing in either process.

#include <gtest/gtest.h>
#include <sys/types.h>
#include <unistd.h>

#include "tests/driver/DriverSetting.h"
#include "tests/driver/FrameCollector.h"
#include "tests/driver/ProcessUsage.h"

using android::sp;

namespace pemaro::test {

namespace {

constexpr int kWarmUps = 10;
constexpr int kRounds = 100;
constexpr int kLeeway = kRounds / 5;

template <typename Round>
void expectNoGrowthOver(pid_t service, Round round) {
    for (int i = 0; i < kWarmUps; ++i) {
        round();
    }
    const ProcessUsage clientBefore(getpid());
    const ProcessUsage serviceBefore(service);
    for (int i = 0; i < kRounds; ++i) {
        round();
    }
    SCOPED_TRACE("client");
    expectNoGrowth(clientBefore, ProcessUsage(getpid()), kLeeway);
    SCOPED_TRACE("service");
    expectNoGrowth(serviceBefore, ProcessUsage(service), kLeeway);
}

}  // namespace

TEST(Leaks, NoneInAHundredRecordings) {
    TouchStack touchStack({"--rate", "0"});
    FrameCollector frames;
    sp<TouchCompanionClient> client = frames.connect();
    ASSERT_NE(nullptr, client);
    expectNoGrowthOver(touchStack.process().pid(), [&] {
        frames.clear();
        ASSERT_EQ(0, client->startRecord());
        ASSERT_TRUE(frames.await(2));
        ASSERT_EQ(0, client->stopRecord());
    });
    EXPECT_EQ("", frames.firstFault());
}

TEST(Leaks, NoneInAHundredClients) {
    TouchStack touchStack({"--rate", "0"});
    expectNoGrowthOver(touchStack.process().pid(), [&] {
        FrameCollector frames;
        sp<TouchCompanionClient> client = frames.connect();
        ASSERT_NE(nullptr, client);
        ASSERT_EQ(0, client->startRecord());
        ASSERT_TRUE(frames.await(1));
        ASSERT_EQ(0, client->stopRecord());
    });
}

}  // namespace pemaro::test
