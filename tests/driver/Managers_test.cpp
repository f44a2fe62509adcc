// SPDX-License-Identifier: Apache-2.0
// The managers' clients and the simulated managers, in processes of their own.

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <signal.h>
#include <unistd.h>

#include <chrono>
#include <cstring>
#include <memory>
#include <string>
#include <thread>
#include <vector>

#include "pemaro/GestureManagerClient.h"
#include "pemaro/HandBiometricManagerClient.h"
#include "pemaro/TouchManagerClient.h"
#include "simulator/managers/GestureRecord.h"
#include "simulator/managers/HandRecord.h"
#include "simulator/managers/Stroke.h"
#include "tests/driver/DriverSetting.h"
#include "tests/driver/ProcessUsage.h"
#include "tests/support/RecordCollector.h"

using android::sp;
using testing::ContainsRegex;
using testing::EndsWith;

namespace pemaro::test {

namespace {

// What a test needs to know about a manager.
struct Touch {
    using Client = TouchManagerClient;
    static constexpr const char* kName = "touch";
    static constexpr int kDeathsTold = 0;  // it does not watch its service
    static constexpr int kRounds = 250;

    static sp<Client> make(RecordCollector& events) {
        return new Client(RecordCollector::onEvent<ITouchManagerClient::GestureData>, &events);
    }
    static int letEventsFlow(Client& client) { return client.enable(1); }
    static int ask(Client& client) {
        bool supported = false;
        return client.isSupported(1, supported);
    }
    static bool isIntact(const std::string& record) {
        return simulator::readGestureRecord(record.data()) != nullptr;
    }
};

// What the managers whose clients watch their service have in common.
template <typename ManagerClient, typename Record>
struct Watched {
    using Client = ManagerClient;
    static constexpr int kDeathsTold = 1;

    static sp<Client> make(RecordCollector& events) {
        return new Client(RecordCollector::onEvent<Record>, RecordCollector::onDeath, &events);
    }
};

struct Gesture : Watched<GestureManagerClient, IGestureManagerClient::GestureData> {
    static constexpr const char* kName = "gesture";
    static constexpr int kRounds = 1000;

    static int letEventsFlow(Client& client) { return client.startGestureDetection(); }
    static int ask(Client& client) {
        unsigned int count = 0;
        return client.getMaxPreDefinedGesture(count);
    }
    static bool isIntact(const std::string& record) { return Touch::isIntact(record); }
};

struct Hand : Watched<HandBiometricManagerClient, IHandBiometricManagerClient::HandBioData> {
    static constexpr const char* kName = "hand";
    static constexpr int kRounds = 250;

    static int letEventsFlow(Client& client) { return client.startMatching(); }
    static int ask(Client& client) {
        unsigned int count = 0;
        return client.getMaxUser(count);
    }
    static bool isIntact(const std::string& record) {
        return simulator::readHandRecord(record.data()) != nullptr;
    }
};

template <typename Manager>
struct Managers : testing::Test {
    static std::vector<std::string> options() {
        return {"--services", Manager::kName, "--gesture-rate", "50", "--hand-rate", "50"};
    }

    static std::string counted(const char* what, int now) {
        return std::string(Manager::kName) + ": a subscriber " + what + ", " + std::to_string(now) +
               " now";
    }

    // Another process that is subscribed, and prints a line for each event.
    static std::unique_ptr<ChildProcess> watcher() {
        return std::make_unique<ChildProcess>(
                std::vector<std::string>{binary("zelkctl"), Manager::kName, "watch"});
    }
};

using All = testing::Types<Touch, Gesture, Hand>;
TYPED_TEST_SUITE(Managers, All);

}  // namespace

TYPED_TEST(Managers, EventsReachClientsInSeveralProcesses) {
    TouchStack stack(this->options());
    RecordCollector events;
    const sp<typename TypeParam::Client> client = TypeParam::make(events);
    ASSERT_EQ(0, client->init());
    const auto other = this->watcher();
    ASSERT_TRUE(stack.awaitLine(this->counted("subscribed", 2)));
    ASSERT_EQ(0, TypeParam::letEventsFlow(*client));
    EXPECT_TRUE(events.await(10));
    EXPECT_TRUE(other->awaitOutput("  #"));
    client->deinit();
    for (const std::string& record : events.records()) {
        EXPECT_TRUE(TypeParam::isIntact(record));
    }
}

TYPED_TEST(Managers, AClientFindsTheRestartedService) {
    auto stack = std::make_unique<TouchStack>(this->options());
    RecordCollector events;
    const sp<typename TypeParam::Client> client = TypeParam::make(events);
    ASSERT_EQ(0, client->init());
    stack->kill();
    EXPECT_TRUE(events.awaitDeaths(TypeParam::kDeathsTold));
    EXPECT_EQ(0x40000000, TypeParam::ask(*client));

    stack = std::make_unique<TouchStack>(this->options());
    EXPECT_EQ(0x40000000, TypeParam::ask(*client)) << "the client does not reconnect by itself";
    EXPECT_EQ(0, client->deinit());
    ASSERT_EQ(0, client->init());
    ASSERT_EQ(0, TypeParam::letEventsFlow(*client));
    EXPECT_TRUE(events.await(3));
    EXPECT_EQ(0, client->deinit());
    EXPECT_EQ(TypeParam::kDeathsTold, events.deaths());
}

TYPED_TEST(Managers, TheServiceForgetsAKilledClientAndGoesOn) {
    TouchStack stack(this->options());
    RecordCollector events;
    const sp<typename TypeParam::Client> client = TypeParam::make(events);
    ASSERT_EQ(0, client->init());
    ASSERT_EQ(0, TypeParam::letEventsFlow(*client));
    const auto other = this->watcher();
    ASSERT_TRUE(other->awaitOutput("  #"));
    other->signal(SIGKILL);
    EXPECT_TRUE(stack.awaitLine(this->counted("died", 1)));
    EXPECT_TRUE(events.await(events.count() + 5));
    client->deinit();
    EXPECT_TRUE(stack.awaitLine(this->counted("unsubscribed", 0)));
}

TYPED_TEST(Managers, EventsArriveWhileAnotherClientLeaves) {
    TouchStack stack(this->options());
    RecordCollector events;
    const sp<typename TypeParam::Client> client = TypeParam::make(events);
    const sp<typename TypeParam::Client> other = TypeParam::make(events);
    ASSERT_EQ(0, client->init());
    ASSERT_EQ(0, TypeParam::letEventsFlow(*client));
    for (int i = 0; i < 20; ++i) {
        ASSERT_EQ(0, other->init());
        ASSERT_TRUE(events.await(events.count() + 2));
        ASSERT_EQ(0, other->deinit());
    }
    client->deinit();
    stack.process().signal(SIGTERM);
    EXPECT_EQ(0, stack.process().wait());
    EXPECT_THAT(stack.process().output(), ContainsRegex(" 0 failed, 0 dropped\n"));
}

TYPED_TEST(Managers, NothingLeaksHoweverOftenOneSubscribes) {
    constexpr int kWarmUps = 20;
    constexpr int kLeeway = 20;
    TouchStack stack({"--services", TypeParam::kName, "--gesture-rate", "0", "--hand-rate", "0"});
    const pid_t service = stack.process().pid();
    RecordCollector events;
    const sp<typename TypeParam::Client> client = TypeParam::make(events);
    const auto round = [&client] {
        ASSERT_EQ(0, client->init());
        ASSERT_EQ(0, client->deinit());
    };
    for (int i = 0; i < kWarmUps; ++i) {
        round();
    }
    const ProcessUsage clientBefore(getpid());
    const ProcessUsage serviceBefore(service);
    for (int i = 0; i < TypeParam::kRounds; ++i) {
        round();
    }
    // The last subscriber's thread may not have ended yet.
    std::this_thread::sleep_for(std::chrono::milliseconds(200));
    {
        SCOPED_TRACE("client");
        expectNoGrowth(clientBefore, ProcessUsage(getpid()), kLeeway);
    }
    {
        SCOPED_TRACE("service");
        expectNoGrowth(serviceBefore, ProcessUsage(service), kLeeway);
    }
    EXPECT_THAT(stack.process().output(), EndsWith(this->counted("unsubscribed", 0) + "\n"));
    EXPECT_EQ(0, events.deaths());
}

TYPED_TEST(Managers, OneThatStandsStillHoldsUpNobody) {
    TouchStack stack(this->options());
    RecordCollector events;
    const sp<typename TypeParam::Client> client = TypeParam::make(events);
    ASSERT_EQ(0, client->init());
    ASSERT_EQ(0, TypeParam::letEventsFlow(*client));
    const auto other = this->watcher();
    ASSERT_TRUE(other->awaitOutput("  #"));
    other->signal(SIGSTOP);
    EXPECT_TRUE(events.await(events.count() + 100)) << "more than the other's queue holds";
    other->signal(SIGKILL);
    EXPECT_TRUE(stack.awaitLine(this->counted("died", 1)));
    client->deinit();
    stack.process().signal(SIGTERM);
    EXPECT_EQ(0, stack.process().wait());
    EXPECT_THAT(stack.process().output(), ContainsRegex(" [1-9][0-9]* dropped\n"));
}

// ---- samples of a gesture, all in one transaction ----

namespace {

using Samples = std::vector<IGestureManagerClient::GestureData>;

// What libbinder maps for the transactions of a process.
constexpr size_t kTransactionBytes = (1 << 20) - 2 * 4096;
constexpr int kMostSamples = kTransactionBytes / sizeof(Samples::value_type);

Samples samplesOf(int shape, int count) {
    Samples samples(static_cast<size_t>(count));
    auto record = std::make_unique<simulator::GestureRecord>();
    for (auto& sample : samples) {
        const auto variation = static_cast<uint32_t>(&sample - samples.data());
        simulator::setStroke(simulator::drawShape(shape, variation), record.get());
        simulator::sealGestureRecord(record.get());
        memcpy(sample.bytes, record.get(), sizeof(sample.bytes));
    }
    return samples;
}

struct GestureSamples : testing::Test {
    GestureSamples() { EXPECT_EQ(0, client->init()); }
    ~GestureSamples() override { client->deinit(); }

    int add(int shape, int count) {
        Samples samples = samplesOf(shape, count);
        return client->addGesture(count, samples.data(), number);
    }

    // A service gives the room of a transaction back a moment after its reply. What follows a large
    // one may still find none.
    int addSoon(int shape, int count) {
        return soon([=] { return add(shape, count); });
    }

    int verifySoon(int shape) {
        return soon([=] {
            Samples samples = samplesOf(shape, 1);
            return client->verifyGesture(samples.data(), number);
        });
    }

    template <typename Operation>
    static int soon(Operation operation) {
        int status = operation();
        for (int i = 0; status == 0x40000000 && i < 100; ++i) {
            std::this_thread::sleep_for(std::chrono::milliseconds(50));
            status = operation();
        }
        return status;
    }

    TouchStack stack{{"--services", "gesture"}};
    RecordCollector events;
    sp<GestureManagerClient> client = Gesture::make(events);
    int number = 0;
};

}  // namespace

TEST_F(GestureSamples, OneAndAsManyAsATransactionHoldsAreStored) {
    EXPECT_EQ(14, kMostSamples);
    EXPECT_EQ(0, add(5, 1));
    EXPECT_EQ(9, number);
    EXPECT_EQ(0, addSoon(6, kMostSamples));
    EXPECT_EQ(10, number);
    EXPECT_EQ(0, verifySoon(5));
    EXPECT_EQ(9, number);
    EXPECT_EQ(0, verifySoon(6));
    EXPECT_EQ(10, number);
}

TEST_F(GestureSamples, TooManyAreRefusedAndNothingIsLost) {
    ASSERT_EQ(0, add(5, 2));
    for (const int count : {kMostSamples + 1, kMostSamples + 2, 100}) {
        number = -7;
        EXPECT_EQ(0x40000000, add(6, count)) << count;
        EXPECT_EQ(-7, number);
    }
    EXPECT_EQ(0, verifySoon(5));
    EXPECT_EQ(9, number);
    EXPECT_EQ(0x40000019, verifySoon(6));
    EXPECT_EQ(0, addSoon(6, kMostSamples)) << "the room is given back";
    EXPECT_EQ(10, number);
    EXPECT_TRUE(stack.process().isRunning());
    EXPECT_EQ(0, events.deaths());
}

}  // namespace pemaro::test
