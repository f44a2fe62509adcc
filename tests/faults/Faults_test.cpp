// SPDX-License-Identifier: Apache-2.0
// Every operation of the four clients, and every step of their init(), against a service that is
// absent, refuses, replies short, stalls and dies. Built twice: with the services in this process,
// and with the services behind the real driver.

#include <dirent.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <unistd.h>

#include <algorithm>
#include <cctype>
#include <cerrno>
#include <chrono>
#include <cstring>
#include <memory>
#include <string>

#include "pemaro/Status.h"
#include "tests/faults/Operations.h"
#include "tests/faults/Peer.h"

namespace pemaro::test {
namespace {

using android::IBinder;
using android::sp;

constexpr int kStatuses = 30;

std::string interfaceTag(int service) {
    const char* const kTags[] = {"ITouchCompanionService", "ITouchManagerService",
                                 "IGestureManagerService", "IHandBiometricManagerService"};
    return kTags[service];
}

Lines errorsOf(const std::string& tag) {
    Lines lines;
    for (const std::string& line : linesOf(tag)) {
        if (line.rfind("E ", 0) == 0) {
            lines.push_back(line);
        }
    }
    return lines;
}

int openDescriptors() {
    int count = 0;
    DIR* folder = opendir("/proc/self/fd");
    while (readdir(folder) != nullptr) {
        ++count;
    }
    closedir(folder);
    return count;
}

// ---- operations ----

class OperationFaults : public ::testing::TestWithParam<Operation> {
  protected:
    // All four, subscribed and registered; the companion's recordings go to a file.
    void connect() {
        mPeer.start();
        mClients = std::make_unique<Clients>();
        ASSERT_EQ(0, mClients->companion->init());
        ASSERT_EQ(0, mClients->touch->init());
        ASSERT_EQ(0, mClients->gesture->init());
        ASSERT_EQ(0, mClients->hand->init());
        ASSERT_EQ(0, mClients->companion->setRecordOutput(0));
        mBinder = mPeer.binder(kServices[mRow.service]);
        ASSERT_NE(nullptr, mBinder);
    }

    void answerWith(const ParcelWriter& write, int delayMillis = 0) {
        Order order;
        order.reply = parcelBytes(write);
        order.delayMillis = delayMillis;
        mPeer.order(order);
    }

    // A call keeps no descriptor and no reference to the service.
    Outcome call() {
        clearLog();
        const int references = mBinder != nullptr ? mBinder->getStrongCount() : 0;
        const int descriptors = openDescriptors();
        const Outcome outcome = mRow.call(*mClients);
        EXPECT_EQ(descriptors, openDescriptors());
        if (mBinder != nullptr) {
            EXPECT_EQ(references, mBinder->getStrongCount());
        }
        return outcome;
    }

    // The notice of a death comes when it comes, on a thread of Binder's.
    void expectErrors(const Lines& inProxy, const Lines& inClient) {
        EXPECT_EQ(inProxy, errorsOf(interfaceTag(mRow.service)));
        Lines lines = errorsOf(mRow.client);
        if (mRow.deathNotice != nullptr) {
            lines.erase(std::remove(lines.begin(), lines.end(), mRow.deathNotice), lines.end());
        }
        EXPECT_EQ(inClient, lines);
    }

    void expectDead() {
        EXPECT_EQ((Outcome{STATUS_UNKNOWN_ERROR, mRow.before}), call());
        expectErrors(errorLines(mRow.deadInProxy, strerror(EPIPE)),
                     errorLines(mRow.deadInClient, errStr(STATUS_UNKNOWN_ERROR)));
    }

    void TearDown() override {
        mClients.reset();
        mBinder.clear();
    }

    const Operation& mRow = GetParam();
    Peer& mPeer = Peer::instance();
    std::unique_ptr<Clients> mClients;
    sp<IBinder> mBinder;
};

TEST_P(OperationFaults, MissesAnAbsentService) {
    mClients = std::make_unique<Clients>();
    mClients->companion->setRecordOutput(0);
    EXPECT_EQ((Outcome{STATUS_INVALID_STATE, mRow.before}), call());
    expectErrors({}, errorLines(mRow.absentInClient, errStr(STATUS_INVALID_STATE)));
}

TEST_P(OperationFaults, PassesEveryRefusalOn) {
    ASSERT_NO_FATAL_FAILURE(connect());
    for (int n = 0; mRow.canRefuse && n < kStatuses; ++n) {
        const int status = STATUS_UNKNOWN_ERROR + n;
        answerWith(mRow.reply(status));
        EXPECT_EQ((Outcome{status, mRow.afterRefusal}), call());
        expectErrors(errorLines(mRow.refusedInProxy, errStr(status)),
                     errorLines(mRow.refusedInClient, errStr(status)));
    }
}

TEST_P(OperationFaults, ReadsNothingBehindAShortReply) {
    ASSERT_NO_FATAL_FAILURE(connect());
    const Bytes whole = parcelBytes(mRow.reply(0));
    for (const ShortReply& cut : mRow.shortReplies) {
        ASSERT_LT(cut.bytes, whole.size());
        Order order;
        order.reply = Bytes(whole.begin(), whole.begin() + static_cast<ptrdiff_t>(cut.bytes));
        mPeer.order(order);
        EXPECT_EQ(cut.outcome, call()) << cut.bytes << " bytes";
        expectErrors(cut.lines, cut.outcome.status == 0 ? Lines{}
                                                        : errorLines(mRow.refusedInClient,
                                                                     errStr(cut.outcome.status)));
    }
}

TEST_P(OperationFaults, WaitsForAServiceThatStalls) {
    ASSERT_NO_FATAL_FAILURE(connect());
    answerWith(mRow.reply(0), 20);
    EXPECT_EQ((Outcome{0, mRow.after}), call());
    expectErrors({}, {});
}

// After a call that was answered, in the middle of the next one, and before the one after that.
TEST_P(OperationFaults, OutlivesTheServicesDeath) {
    ASSERT_NO_FATAL_FAILURE(connect());
    answerWith(mRow.reply(0));
    EXPECT_EQ((Outcome{0, mRow.after}), call());

    Order order;
    order.deadly = Order::kAnyCall;
    mPeer.order(order);
    expectDead();
    expectDead();

    // Both clients that watch their services are told, and once.
    const auto giveUp = std::chrono::steady_clock::now() + std::chrono::seconds(30);
    while (mClients->deaths() < 2 && std::chrono::steady_clock::now() < giveUp) {
        usleep(1000);
    }
    EXPECT_EQ(2, mClients->deaths());
}

INSTANTIATE_TEST_SUITE_P(
        All, OperationFaults, ::testing::ValuesIn(allOperations()), [](const auto& info) {
            std::string name = std::string(info.param.client) + "_" + info.param.name;
            name.erase(std::remove_if(name.begin(), name.end(),
                                      [](unsigned char c) { return isalnum(c) == 0; }),
                       name.end());
            return name;
        });

// ---- init() ----

struct Init {
    const char* client;
    int service;
    std::function<int(Clients&)> call;
    // The step whose status counts: its transaction and what is logged.
    uint32_t code;
    const char* refusedInProxy;
    const char* deadInProxy;
    const char* failedInClient;
};

std::ostream& operator<<(std::ostream& stream, const Init& row) {
    return stream << row.client << "::init, code " << row.code;
}

const Init kInits[] = {
        // A proxy reads no status of registerClient.
        {"TouchCompanionClient", 0, [](Clients& c) { return c.companion->init(); }, 1, nullptr,
         "registerClient() error: %s", "registerClient failed"},
        {"TouchCompanionClient", 0, [](Clients& c) { return c.companion->init(); }, 3,
         "init() error: %s", "init() error: %s", "init service failed"},
        {"TouchManagerClient", 1, [](Clients& c) { return c.touch->init(); }, 1, nullptr,
         "subscribe() error: %s", "subscribing to service failed"},
        {"GestureManagerClient", 2, [](Clients& c) { return c.gesture->init(); }, 1, nullptr,
         "subscribe() error: %s", "subscribing to service failed"},
        {"HandBiometricManagerClient", 3, [](Clients& c) { return c.hand->init(); }, 1, nullptr,
         "subscribe() error: %s", "subscribing to service failed"},
};

class InitFaults : public ::testing::TestWithParam<Init> {
  protected:
    int init() {
        clearLog();
        mClients = std::make_unique<Clients>();
        return mRow.call(*mClients);
    }

    void TearDown() override { mClients.reset(); }

    const Init& mRow = GetParam();
    Peer& mPeer = Peer::instance();
    std::unique_ptr<Clients> mClients;
};

TEST_P(InitFaults, PassesEveryRefusalOn) {
    mPeer.start();
    const int descriptors = openDescriptors();
    for (int n = 0; n < kStatuses; ++n) {
        const int status = STATUS_UNKNOWN_ERROR + n;
        Order order;
        order.reply = parcelBytes([&](android::Parcel& reply) { reply.writeInt32(status); });
        mPeer.order(order);
        EXPECT_EQ(status, init());
        // Whichever step is the last: where all are refused the later one tells it.
        if (mRow.code == 1 && mRow.service == 0) {
            continue;
        }
        EXPECT_EQ(errorLines(mRow.refusedInProxy, errStr(status)),
                  errorsOf(interfaceTag(mRow.service)));
        EXPECT_EQ(errorLines(mRow.failedInClient, ""), errorsOf(mRow.client));
    }
    EXPECT_GE(descriptors + 1, openDescriptors()) << "one for the platform's own at the most";
}

TEST_P(InitFaults, OutlivesTheServicesDeathAtItsStep) {
    mPeer.start();
    Order order;
    order.deadly = mRow.code;
    mPeer.order(order);
    EXPECT_EQ(STATUS_UNKNOWN_ERROR, init());
    EXPECT_EQ(errorLines(mRow.deadInProxy, strerror(EPIPE)), errorsOf(interfaceTag(mRow.service)));
    EXPECT_EQ(errorLines(mRow.failedInClient, ""), errorsOf(mRow.client));
}

INSTANTIATE_TEST_SUITE_P(All, InitFaults, ::testing::ValuesIn(kInits), [](const auto& info) {
    return info.param.client + std::to_string(info.param.code);
});

}  // namespace
}  // namespace pemaro::test
