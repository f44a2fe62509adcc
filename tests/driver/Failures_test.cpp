// SPDX-License-Identifier: Apache-2.0
// Processes that die or refuse while others rely on them.

#include "pemaro/Binder.h"

#include <binder/IServiceManager.h>
#include <gtest/gtest.h>
#include <signal.h>
#include <unistd.h>

#include <functional>
#include <memory>
#include <ostream>
#include <string>
#include <utility>
#include <vector>

#include "pemaro/Status.h"
#include "simulator/faults/Fault.h"
#include "tests/driver/DriverSetting.h"
#include "tests/driver/FrameCollector.h"

using android::sp;

namespace pemaro::test {

namespace {

// Starts a recording in a process of its own; it runs when this returns.
std::unique_ptr<ChildProcess> recordElsewhere(TouchStack& touchStack) {
    auto process =
            std::make_unique<ChildProcess>(std::vector<std::string>{binary("zelkctl"), "record"});
    EXPECT_TRUE(touchStack.awaitLine("client " + std::to_string(process->pid()) + " records"));
    return process;
}

}  // namespace

TEST(ClientDeath, EndsItsRecordingAndNoOther) {
    TouchStack touchStack({"--rate", "0"});
    FrameCollector frames;
    sp<TouchCompanionClient> client = frames.connect();
    ASSERT_NE(nullptr, client);
    ASSERT_EQ(0, client->startRecord());
    std::unique_ptr<ChildProcess> victim = recordElsewhere(touchStack);
    const std::string name = "client " + std::to_string(victim->pid());
    victim->signal(SIGKILL);
    EXPECT_EQ(128 + SIGKILL, victim->wait());
    EXPECT_TRUE(touchStack.awaitLine(name + " died"));
    EXPECT_TRUE(touchStack.process().awaitOutput(name + " stopped: "));

    const uint64_t before = frames.frames();
    EXPECT_TRUE(frames.await(before + 200));
    EXPECT_EQ(0, client->stopRecord());
    EXPECT_EQ("", frames.firstFault());
    EXPECT_EQ(0u, frames.lost());
}

TEST(ClientDeath, LeavesTheServiceWellWhereverItStrikes) {
    // Few frames: the victims die inside the wait on the shared condition.
    TouchStack touchStack({"--rate", "20"});
    for (int i = 0; i < 6; ++i) {
        std::unique_ptr<ChildProcess> victim = recordElsewhere(touchStack);
        usleep(static_cast<useconds_t>(30000 + 7000 * i));
        const std::string name = "client " + std::to_string(victim->pid());
        victim.reset();
        EXPECT_TRUE(touchStack.awaitLine(name + " died"));
        EXPECT_TRUE(touchStack.process().awaitOutput(name + " stopped: "));
    }
    const RunResult after = run({binary("zelkctl"), "record", "--frames", "5"});
    EXPECT_EQ(0, after.status) << after.errors;
    touchStack.process().signal(SIGTERM);
    EXPECT_EQ(0, touchStack.process().wait());
}

TEST(ServiceDeath, InMidRecordingYieldsStatusesAndNoHang) {
    FrameCollector frames;
    sp<TouchCompanionClient> client;
    {
        TouchStack touchStack;
        client = frames.connect();
        ASSERT_NE(nullptr, client);
        ASSERT_EQ(0, client->startRecord());
        ASSERT_TRUE(frames.await(20));
        touchStack.kill();
    }
    EXPECT_EQ(STATUS_UNKNOWN_ERROR, client->stopRecord());
    EXPECT_EQ(STATUS_UNKNOWN_ERROR, client->startRecord());
    EXPECT_EQ(STATUS_UNKNOWN_ERROR, client->setRecordOutput(1));
    EXPECT_EQ(0, client->pingService());
    EXPECT_EQ("", frames.firstFault());
}

TEST(ServiceDeath, IsOvercomeByAnotherInit) {
    FrameCollector frames;
    sp<TouchCompanionClient> client;
    {
        TouchStack touchStack;
        client = frames.connect();
        ASSERT_NE(nullptr, client);
        touchStack.kill();
    }
    TouchStack next({"--rate", "0"});
    ASSERT_EQ(0, client->init());
    EXPECT_EQ(1, client->pingService());
    ASSERT_EQ(0, client->setRecordOutput(1));
    ASSERT_EQ(0, client->startRecord());
    EXPECT_TRUE(frames.await(50));
    EXPECT_EQ(0, client->stopRecord());
    EXPECT_EQ("", frames.firstFault());
}

namespace {

struct OrderedFault {
    const char* fault;
    const char* where;  // the operation of the client that meets it
    int status;         // what that returns
};

std::ostream& operator<<(std::ostream& stream, const OrderedFault& row) {
    return stream << row.fault;
}

class OrderedFaults : public ::testing::TestWithParam<OrderedFault> {};

// Goes through a recording up to the operation `where`, and returns its status.
int recordUpTo(const std::string& where) {
    FrameCollector frames;
    sp<TouchCompanionClient> client = frames.makeClient();
    const std::pair<const char*, std::function<int()>> steps[] = {
            {"init", [&] { return client->init(); }},
            {"setRecordOutput", [&] { return client->setRecordOutput(1); }},
            {"startRecord", [&] { return client->startRecord(); }},
            {"stopRecord", [&] { return client->stopRecord(); }},
    };
    for (const auto& [name, step] : steps) {
        const int status = step();
        if (name == where) {
            return status;
        }
        EXPECT_EQ(0, status) << name;
    }
    return 0;
}

}  // namespace

TEST_P(OrderedFaults, ReachTheCallerAsAStatus) {
    const OrderedFault& row = GetParam();
    TouchStack touchStack({"--fault", row.fault});
    EXPECT_EQ(row.status, recordUpTo(row.where));
}

INSTANTIATE_TEST_SUITE_P(
        All, OrderedFaults,
        ::testing::Values(
                OrderedFault{"registerClient=status:0x40000010", "init", STATUS_INVALID_STATE},
                OrderedFault{"registerClient=die", "init", STATUS_UNKNOWN_ERROR},
                OrderedFault{"open=status:0x4000000A", "init", STATUS_ERROR_ACQUIRING_RESOURCE},
                OrderedFault{"open=die", "init", STATUS_UNKNOWN_ERROR},
                OrderedFault{"setRecordParameter=status:0x4000000E", "setRecordOutput",
                             STATUS_UNSUPPORTED},
                // The status of prepareRecord goes unread; without it there is no block.
                OrderedFault{"prepareRecord=status:0x40000010", "startRecord",
                             STATUS_ERROR_ACQUIRING_RESOURCE},
                OrderedFault{"prepareRecord=die", "startRecord", STATUS_UNKNOWN_ERROR},
                OrderedFault{"getCblk=null", "startRecord", STATUS_ERROR_ACQUIRING_RESOURCE},
                OrderedFault{"getCblk=die", "startRecord", STATUS_ERROR_ACQUIRING_RESOURCE},
                OrderedFault{"startRecord=status:0x40000010", "startRecord", STATUS_ERROR_AFE_HAL},
                OrderedFault{"startRecord=delay:300ms", "startRecord", 0},
                OrderedFault{"startRecord=die", "startRecord", STATUS_UNKNOWN_ERROR},
                OrderedFault{"stopRecord=status:0x40000015", "stopRecord", STATUS_TIMEOUT},
                OrderedFault{"stopRecord=die", "stopRecord", STATUS_UNKNOWN_ERROR}));

// A stub's result crosses the driver only when it is negative, and the library's are not.
TEST(PositiveResults, ArriveAsSuccessWithWhatTheReplyHolds) {
    TouchStack touchStack({"--fault", "unregisterClient=status:0x4000000B"});
    FrameCollector frames;
    ASSERT_NE(nullptr, frames.connect());
    const sp<ITouchCompanionService> service =
            ITouchCompanionService::asInterface(android::defaultServiceManager()->checkService(
                    android::String16("pemaro.TouchService")));
    EXPECT_EQ(0, service->unregisterClient());

    const size_t length = service->getConfigParams(nullptr, 0);
    ASSERT_LT(1u, length);
    std::vector<char> tooSmall(length - 1, 'x');
    EXPECT_EQ(length, service->getConfigParams(tooSmall.data(), tooSmall.size()));
    EXPECT_EQ(std::vector<char>(length - 1, 'x'), tooSmall);

    // More than a service can allocate: nothing is answered, which reads as no configuration.
    EXPECT_EQ(0u, service->getConfigParams(tooSmall.data(), size_t{0xffffffff}));

    const sp<TouchCompanionClient> client = frames.makeClient();
    ASSERT_EQ(0, client->init());
    size_t capacity = tooSmall.size();
    EXPECT_EQ(STATUS_UNKNOWN_ERROR, client->getConfigParams(tooSmall.data(), &capacity));
    EXPECT_EQ(tooSmall.size(), capacity);
}

TEST(Faults, DeathIsTheOrderedOne) {
    TouchStack touchStack({"--fault", "open=die"});
    recordUpTo("init");
    EXPECT_EQ(simulator::FaultTable::kDeathStatus, touchStack.process().wait());
    EXPECT_EQ("zelk-touchstack: dies at open, as ordered\n", touchStack.process().errors());
}

TEST(TouchStackProcess, StopsCleanlyOnItsSignals) {
    for (int signal : {SIGTERM, SIGINT}) {
        TouchStack touchStack({"--rate", "0"});
        EXPECT_EQ(0, run({binary("zelkctl"), "record", "--frames", "10"}).status);
        touchStack.process().signal(signal);
        EXPECT_EQ(0, touchStack.process().wait());
        EXPECT_EQ("", touchStack.process().errors());
        EXPECT_NE(std::string::npos, touchStack.process().output().find("stopped: 1 recordings, "));
    }
}

}  // namespace pemaro::test
