// SPDX-License-Identifier: Apache-2.0
// Every operation of the four clients, and every step of init(), of deinit() and of a recording to
// memory, against a service that is absent, refuses, replies short, stalls, and dies before, in and
// after it. Built twice: with the services in this process, and with the services behind the real
// driver.

#include <dirent.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <unistd.h>

#include <algorithm>
#include <cctype>
#include <cerrno>
#include <chrono>
#include <cstring>
#include <future>
#include <memory>
#include <string>
#include <utility>

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

Order answering(const ParcelWriter& write, uint32_t code = Order::kAnyCall) {
    Order order;
    order.reply = parcelBytes(write);
    order.code = code;
    return order;
}

ParcelWriter statusReply(int status) {
    return [status](android::Parcel& reply) { reply.writeInt32(status); };
}

// Makes the call on another thread while `order` holds it up, sees that it waits, and lets it go.
template <typename Call>
auto callHeldUp(Peer& peer, Order order, uint32_t code, Call call) {
    order.stalled = code;
    peer.order(order);
    auto result = std::async(std::launch::async, call);
    EXPECT_TRUE(peer.awaitStalled());
    EXPECT_EQ(std::future_status::timeout, result.wait_for(std::chrono::milliseconds(10)));
    order.stalled = Order::kNoCall;
    peer.order(order);
    return result.get();
}

// Whether nothing of a call is left: descriptors, and references to the service. Over the driver
// some are let go a little later, and those of an earlier test may be counted at first.
class Traces {
  public:
    explicit Traces(sp<IBinder> binder)
            : mBinder(std::move(binder)),
              mReferences(references()),
              mDescriptors(openDescriptors()) {}

    void expectNone() const {
        const auto giveUp = std::chrono::steady_clock::now() + std::chrono::seconds(10);
        while (isOne() && std::chrono::steady_clock::now() < giveUp) {
            usleep(1000);
        }
        EXPECT_GE(mReferences, references());
        EXPECT_GE(mDescriptors, openDescriptors());
    }

  private:
    bool isOne() const { return openDescriptors() > mDescriptors || references() > mReferences; }

    int32_t references() const { return mBinder != nullptr ? mBinder->getStrongCount() : 0; }

    const sp<IBinder> mBinder;
    const int32_t mReferences;
    const int mDescriptors;
};

Lines without(Lines lines, const char* line) {
    if (line != nullptr) {
        lines.erase(std::remove(lines.begin(), lines.end(), line), lines.end());
    }
    return lines;
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

    void answerWith(const ParcelWriter& write) { mPeer.order(answering(write)); }

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
        EXPECT_EQ(inClient, without(errorsOf(mRow.client), mRow.deathNotice));
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
    clearLog();
    const Traces traces(mBinder);
    const Outcome outcome = callHeldUp(mPeer, answering(mRow.reply(0)), Order::kAnyCall,
                                       [this] { return mRow.call(*mClients); });
    EXPECT_EQ((Outcome{0, mRow.after}), outcome);
    expectErrors({}, {});
    traces.expectNone();
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
    int (*call)(Clients& clients);
    // The step: its transaction, and what is logged of it. A null text is no line.
    uint32_t code;
    const char* refusedInProxy;
    const char* deadInProxy;
    const char* failedInClient;
    // False where the proxy reads no status.
    bool canRefuse;
    // What is logged without a service, and of success.
    const char* absentInClient;
    const char* succeededInClient;
    // An operation, and whether a client whose init() failed has a service for it all the same.
    int (*operation)(Clients& clients);
    bool keepsService;
    int deathNotices;
};

std::ostream& operator<<(std::ostream& stream, const Init& row) {
    return stream << row.client << "::init, code " << row.code;
}

int initCompanion(Clients& clients) {
    return clients.companion->init();
}

int saveConfig(Clients& clients) {
    return clients.companion->saveConfig(nullptr);
}

constexpr char kConnected[] = "Init successful: X";
constexpr char kUnsubscribed[] = "subscribing to service failed";

const Init kInits[] = {
        {"TouchCompanionClient", 0, initCompanion, 1, nullptr, "registerClient() error: %s",
         "registerClient failed", false, "couldn't find the service", "Init successfully",
         saveConfig, true, 0},
        {"TouchCompanionClient", 0, initCompanion, 3, "init() error: %s", "init() error: %s",
         "init service failed", true, "couldn't find the service", "Init successfully", saveConfig,
         true, 0},
        {"TouchManagerClient", 1, [](Clients& c) { return c.touch->init(); }, 1, nullptr,
         "subscribe() error: %s", kUnsubscribed, true, "couldn't find the service", kConnected,
         [](Clients& c) { return c.touch->enable(1); }, true, 0},
        {"GestureManagerClient", 2, [](Clients& c) { return c.gesture->init(); }, 1, nullptr,
         "subscribe() error: %s", kUnsubscribed, true, "couldn't find service", kConnected,
         [](Clients& c) { return c.gesture->enableWakeup(); }, false, 1},
        {"HandBiometricManagerClient", 3, [](Clients& c) { return c.hand->init(); }, 1, nullptr,
         "subscribe() error: %s", kUnsubscribed, true, "couldn't find service", "Init successful",
         [](Clients& c) { return c.hand->scan(); }, false, 1},
};

class InitFaults : public ::testing::TestWithParam<Init> {
  protected:
    int init() {
        clearLog();
        mClients = std::make_unique<Clients>();
        return mRow.call(*mClients);
    }

    sp<IBinder> binder() { return mPeer.binder(kServices[mRow.service]); }

    void expectErrors(const Lines& inProxy, const char* inClient) {
        EXPECT_EQ(inProxy, errorsOf(interfaceTag(mRow.service)));
        EXPECT_EQ(errorLines(inClient, ""), errorsOf(mRow.client));
    }

    // Success, the client at its service, and nothing left when it is gone.
    void expectConnected() {
        expectErrors({}, mRow.succeededInClient);
        mPeer.order({});
        EXPECT_EQ(0, mRow.operation(*mClients));
    }

    void TearDown() override { mClients.reset(); }

    const Init& mRow = GetParam();
    Peer& mPeer = Peer::instance();
    std::unique_ptr<Clients> mClients;
};

TEST_P(InitFaults, MissesAnAbsentService) {
    mPeer.start();
    mPeer.kill();
    const Traces traces(nullptr);
    EXPECT_EQ(STATUS_ERROR_ACQUIRING_RESOURCE, init());
    expectErrors({}, mRow.absentInClient);
    EXPECT_EQ(STATUS_INVALID_STATE, mRow.operation(*mClients));
    mClients.reset();
    traces.expectNone();
}

TEST_P(InitFaults, PassesEveryRefusalOn) {
    mPeer.start();
    init();  // what the platform opens for itself, once
    mClients.reset();
    const Traces traces(binder());
    for (int n = 0; n < kStatuses; ++n) {
        const int status = STATUS_UNKNOWN_ERROR + n;
        mPeer.order(answering(statusReply(status), mRow.code));
        if (!mRow.canRefuse) {
            EXPECT_EQ(0, init());
            expectConnected();
            continue;
        }
        EXPECT_EQ(status, init());
        expectErrors(errorLines(mRow.refusedInProxy, errStr(status)), mRow.failedInClient);
        mPeer.order({});
        EXPECT_EQ(mRow.keepsService ? 0 : STATUS_INVALID_STATE, mRow.operation(*mClients));
    }
    mClients.reset();
    traces.expectNone();
}

TEST_P(InitFaults, TakesAnEmptyReplyForSuccess) {
    mPeer.start();
    const Traces traces(binder());
    mPeer.order(answering([](android::Parcel&) {}, mRow.code));
    EXPECT_EQ(0, init());
    expectConnected();
    mClients.reset();
    traces.expectNone();
}

TEST_P(InitFaults, WaitsForAServiceThatStalls) {
    mPeer.start();
    const Traces traces(binder());
    EXPECT_EQ(0, callHeldUp(mPeer, {}, mRow.code, [this] { return init(); }));
    expectConnected();
    mClients.reset();
    traces.expectNone();
}

TEST_P(InitFaults, OutlivesTheServicesDeathAtItsStep) {
    mPeer.start();
    const Traces traces(nullptr);
    Order order;
    order.deadly = mRow.code;
    mPeer.order(order);
    EXPECT_EQ(STATUS_UNKNOWN_ERROR, init());
    expectErrors(errorLines(mRow.deadInProxy, strerror(EPIPE)), mRow.failedInClient);
    EXPECT_EQ(mRow.keepsService ? STATUS_UNKNOWN_ERROR : STATUS_INVALID_STATE,
              mRow.operation(*mClients));
    mClients.reset();
    traces.expectNone();
}

TEST_P(InitFaults, OutlivesTheServicesDeathBehindItAndConnectsToTheNext) {
    mPeer.start();
    const Traces traces(nullptr);
    ASSERT_EQ(0, init());
    mPeer.kill();
    const auto giveUp = std::chrono::steady_clock::now() + std::chrono::seconds(30);
    while (mClients->deaths() < mRow.deathNotices && std::chrono::steady_clock::now() < giveUp) {
        usleep(1000);
    }
    EXPECT_EQ(mRow.deathNotices, mClients->deaths());
    EXPECT_EQ(STATUS_UNKNOWN_ERROR, mRow.operation(*mClients));

    mPeer.start();
    EXPECT_EQ(0, mRow.call(*mClients));
    EXPECT_EQ(0, mRow.operation(*mClients));
    mClients.reset();
    traces.expectNone();
}

INSTANTIATE_TEST_SUITE_P(All, InitFaults, ::testing::ValuesIn(kInits), [](const auto& info) {
    return info.param.client + std::to_string(info.param.code);
});

// ---- deinit(), which is a success whatever becomes of it ----

struct Deinit {
    const char* client;
    int service;
    int (*init)(Clients& clients);
    int (*deinit)(Clients& clients);
    int (*operation)(Clients& clients);
    const char* deathNotice;
};

std::ostream& operator<<(std::ostream& stream, const Deinit& row) {
    return stream << row.client << "::deinit";
}

const Deinit kDeinits[] = {
        {"TouchManagerClient", 1, [](Clients& c) { return c.touch->init(); },
         [](Clients& c) { return c.touch->deinit(); },
         [](Clients& c) { return c.touch->enable(1); }, nullptr},
        {"GestureManagerClient", 2, [](Clients& c) { return c.gesture->init(); },
         [](Clients& c) { return c.gesture->deinit(); },
         [](Clients& c) { return c.gesture->enableWakeup(); }, "E Gesture Manager Service died!"},
        {"HandBiometricManagerClient", 3, [](Clients& c) { return c.hand->init(); },
         [](Clients& c) { return c.hand->deinit(); }, [](Clients& c) { return c.hand->scan(); },
         "E HB Manager Service died!"},
};

constexpr uint32_t kUnsubscribe = 2;
constexpr char kDeadInUnsubscribe[] = "unsubscribe() error: %s";

class DeinitFaults : public ::testing::TestWithParam<Deinit> {
  protected:
    void connect() {
        mPeer.start();
        ASSERT_EQ(0, mRow.init(*mClients));
        clearLog();
    }

    void expectIdle(const Lines& inProxy) {
        EXPECT_EQ(inProxy, errorsOf(interfaceTag(mRow.service)));
        EXPECT_EQ(Lines(), without(errorsOf(mRow.client), mRow.deathNotice));
        EXPECT_EQ(STATUS_INVALID_STATE, mRow.operation(*mClients));
    }

    sp<IBinder> binder() { return mPeer.binder(kServices[mRow.service]); }

    const Deinit& mRow = GetParam();
    Peer& mPeer = Peer::instance();
    std::unique_ptr<Clients> mClients = std::make_unique<Clients>();
};

TEST_P(DeinitFaults, MissesNoService) {
    clearLog();
    EXPECT_EQ(0, mRow.deinit(*mClients));
    expectIdle({});
}

TEST_P(DeinitFaults, TakesNoRefusalAndEveryShortReply) {
    mPeer.start();
    const Traces traces(binder());
    for (int n = 0; n <= kStatuses; ++n) {
        ASSERT_NO_FATAL_FAILURE(connect());
        mPeer.order(n < kStatuses ? answering(statusReply(STATUS_UNKNOWN_ERROR + n), kUnsubscribe)
                                  : answering([](android::Parcel&) {}, kUnsubscribe));
        EXPECT_EQ(0, mRow.deinit(*mClients));
        expectIdle({});
    }
    traces.expectNone();
}

TEST_P(DeinitFaults, WaitsForAServiceThatStalls) {
    mPeer.start();
    const Traces traces(binder());
    ASSERT_NO_FATAL_FAILURE(connect());
    EXPECT_EQ(0, callHeldUp(mPeer, {}, kUnsubscribe, [this] { return mRow.deinit(*mClients); }));
    expectIdle({});
    traces.expectNone();
}

TEST_P(DeinitFaults, OutlivesTheServicesDeathInIt) {
    ASSERT_NO_FATAL_FAILURE(connect());
    Order order;
    order.deadly = kUnsubscribe;
    mPeer.order(order);
    EXPECT_EQ(0, mRow.deinit(*mClients));
    expectIdle(errorLines(kDeadInUnsubscribe, strerror(EPIPE)));
}

TEST_P(DeinitFaults, OutlivesTheServicesDeathBeforeIt) {
    ASSERT_NO_FATAL_FAILURE(connect());
    mPeer.kill();
    EXPECT_EQ(0, mRow.deinit(*mClients));
    expectIdle(errorLines(kDeadInUnsubscribe, strerror(EPIPE)));
}

INSTANTIATE_TEST_SUITE_P(All, DeinitFaults, ::testing::ValuesIn(kDeinits),
                         [](const auto& info) { return std::string(info.param.client); });

// ---- a recording to memory ----

struct RecordStep {
    const char* name;
    uint32_t code;
    // What a refusal comes to, where its status is read, and what a short reply does.
    int (*refused)(int status);
    int shortened;
    const char* refusedInProxy;
    const char* deadInProxy;
    int dead;
    const char* refusedInClient;
    const char* shortenedInClient;
    const char* deadInClient;
    // Whether a client whose step failed has the ring.
    bool hasRing;
};

std::ostream& operator<<(std::ostream& stream, const RecordStep& row) {
    return stream << row.name;
}

constexpr char kNoBlock[] = "couldn't get shared control block";

const RecordStep kRecordSteps[] = {
        {"prepareRecord", 5, [](int) { return 0; }, 0, nullptr, "prepareRecord() error: %s",
         STATUS_UNKNOWN_ERROR, nullptr, nullptr, "fail to prepare recording", false},
        // No status has room in its reply: whatever is no memory is the want of one.
        {"getCblk", 4, [](int) { return STATUS_ERROR_ACQUIRING_RESOURCE; },
         STATUS_ERROR_ACQUIRING_RESOURCE, nullptr, "getCblk() error: %s",
         STATUS_ERROR_ACQUIRING_RESOURCE, kNoBlock, kNoBlock, kNoBlock, false},
        {"startRecord", 6, [](int status) { return status; }, 0, "startRecord() error: %s",
         "startRecord() error: %s", STATUS_UNKNOWN_ERROR, "startRecord failed", nullptr,
         "startRecord failed", true},
};

class RecordFaults : public ::testing::TestWithParam<RecordStep> {
  protected:
    void connect() {
        mPeer.start();
        mClients = std::make_unique<Clients>();
        ASSERT_EQ(0, mClients->companion->init());
        ASSERT_EQ(0, mClients->companion->setRecordOutput(1));
        clearLog();
    }

    static Order ring() {
        Order order;
        order.ring = true;
        order.code = Order::kNoCall;
        return order;
    }

    static Order ringBut(const ParcelWriter& write, uint32_t code) {
        Order order = answering(write, code);
        order.ring = true;
        return order;
    }

    void expectErrors(const Lines& inProxy, const char* inClient) {
        EXPECT_EQ(inProxy, errorsOf("ITouchCompanionService"));
        EXPECT_EQ(errorLines(inClient, ""), errorsOf("TouchCompanionClient"));
        clearLog();
    }

    // A ring without frames: 63 waits. No ring: none.
    void expectRing(bool isThere) {
        TouchCompanionClient::FrameBuffer buffer = {};
        buffer.size = 16;
        EXPECT_EQ(isThere ? STATUS_TIMEOUT : STATUS_INVALID_STATE,
                  mClients->companion->acquireBuffer(&buffer));
        clearLog();
    }

    void TearDown() override { mClients.reset(); }

    const RecordStep& mRow = GetParam();
    Peer& mPeer = Peer::instance();
    std::unique_ptr<Clients> mClients;
};

TEST_P(RecordFaults, PassesEveryRefusalOn) {
    ASSERT_NO_FATAL_FAILURE(connect());
    for (int n = 0; n < kStatuses; ++n) {
        const int status = STATUS_UNKNOWN_ERROR + n;
        mPeer.order(ringBut(statusReply(status), mRow.code));
        EXPECT_EQ(mRow.refused(status), mClients->companion->startRecord());
        expectErrors(errorLines(mRow.refusedInProxy, errStr(status)), mRow.refusedInClient);
        expectRing(mRow.hasRing || mRow.refused(status) == 0);
        mPeer.order(ring());
        EXPECT_EQ(0, mClients->companion->stopRecord());
        expectRing(false);
    }
}

TEST_P(RecordFaults, ReadsNothingBehindAShortReply) {
    ASSERT_NO_FATAL_FAILURE(connect());
    mPeer.order(ringBut([](android::Parcel&) {}, mRow.code));
    EXPECT_EQ(mRow.shortened, mClients->companion->startRecord());
    expectErrors({}, mRow.shortenedInClient);
    expectRing(mRow.hasRing || mRow.shortened == 0);
}

TEST_P(RecordFaults, WaitsForAServiceThatStalls) {
    ASSERT_NO_FATAL_FAILURE(connect());
    mPeer.order(ring());
    // The first ring is the one for which the platform opens what it keeps.
    ASSERT_EQ(0, mClients->companion->startRecord());
    ASSERT_EQ(0, mClients->companion->stopRecord());
    const Traces traces(mPeer.binder(kServices[0]));
    EXPECT_EQ(0, callHeldUp(mPeer, ring(), mRow.code,
                            [this] { return mClients->companion->startRecord(); }));
    expectErrors({}, nullptr);
    expectRing(true);
    EXPECT_EQ(0, mClients->companion->stopRecord());
    traces.expectNone();
}

// In it, and then before each operation of a recording.
TEST_P(RecordFaults, OutlivesTheServicesDeath) {
    const Traces traces(nullptr);
    ASSERT_NO_FATAL_FAILURE(connect());
    Order order = ring();
    order.deadly = mRow.code;
    mPeer.order(order);
    EXPECT_EQ(mRow.dead, mClients->companion->startRecord());
    expectErrors(errorLines(mRow.deadInProxy, strerror(EPIPE)), mRow.deadInClient);
    expectRing(mRow.hasRing);
    EXPECT_EQ(STATUS_UNKNOWN_ERROR, mClients->companion->stopRecord());
    expectErrors(errorLines("stopRecord() error: %s", strerror(EPIPE)), "stopRecord failed");
    expectRing(mRow.hasRing);
    mClients.reset();
    traces.expectNone();
}

INSTANTIATE_TEST_SUITE_P(All, RecordFaults, ::testing::ValuesIn(kRecordSteps),
                         [](const auto& info) { return std::string(info.param.name); });

TEST(AcquireBufferFaults, HasNoRingWithoutAService) {
    Clients clients;
    TouchCompanionClient::FrameBuffer buffer = {};
    EXPECT_EQ(STATUS_INVALID_STATE, clients.companion->acquireBuffer(&buffer));
}

// The platform answers a ping, so that there is nothing to refuse, to shorten or to hold up.
TEST(PingFaults, TellWhetherTheServiceLives) {
    Peer& peer = Peer::instance();
    peer.start();
    const Traces traces(nullptr);
    {
        Clients clients;
        clearLog();
        EXPECT_EQ(0, clients.companion->pingService());
        ASSERT_EQ(0, clients.companion->init());
        for (int n = 0; n < kStatuses; ++n) {
            peer.order(answering(statusReply(STATUS_UNKNOWN_ERROR + n)));
            EXPECT_EQ(1, clients.companion->pingService());
        }
        clearLog();
        peer.kill();
        EXPECT_EQ(0, clients.companion->pingService());
        EXPECT_EQ(0, clients.companion->pingService());
        EXPECT_EQ(Lines(), errorsOf("TouchCompanionClient"));
        EXPECT_EQ(Lines(), errorsOf("ITouchCompanionService"));
        peer.start();
        EXPECT_EQ(0, clients.companion->init());
        EXPECT_EQ(1, clients.companion->pingService());
    }
    traces.expectNone();
}

}  // namespace
}  // namespace pemaro::test
