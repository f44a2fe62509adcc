// SPDX-License-Identifier: Apache-2.0
// Connecting to the service, pinging it, and letting go of it.

#include "pemaro/TouchCompanionClient.h"

#include <binder/ProcessState.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "pemaro/testkit/NativeBinder.h"
#include "tests/companion/TouchCompanionClientTest.h"
#include "tests/support/RecordingBinder.h"

namespace pemaro::test {
namespace {

using android::sp;
using android::wp;
using ::testing::ElementsAre;
using ::testing::IsEmpty;

// ---- init ----

TEST_F(TouchCompanionClientTest, RegistersAndOpens) {
    const sp<TouchCompanionClient> client = new TouchCompanionClient;
    EXPECT_EQ(0, client->init());
    EXPECT_THAT(mService->calls(), ElementsAre("registerClient", "open"));
    EXPECT_EQ(1, mServices->lookups("pemaro.TouchService"));
    EXPECT_THAT(clientLines(), ElementsAre("E Init successfully"));
}

TEST_F(TouchCompanionClientTest, RegistersACallbackObjectOfItsOwn) {
    const sp<TouchCompanionClient> client = connect();
    ASSERT_NE(nullptr, mService->client);
    android::Parcel data;
    writeToken(data, "pemaro.TouchServiceClient");
    android::Parcel reply;
    const sp<android::IBinder> handle = android::IInterface::asBinder(mService->client);
    EXPECT_EQ(android::NO_ERROR,
              handle->transact(android::IBinder::PING_TRANSACTION, data, &reply));
}

TEST_F(TouchCompanionClientTest, TouchesNeitherBlockNorThreadInInit) {
    Frames frames;
    const sp<TouchCompanionClient> client = new TouchCompanionClient(Frames::callback, &frames);
    FrameRing ring(8, 64);
    ring.put();
    mService->cblk = ring.memory();
    EXPECT_EQ(0, client->init());
    EXPECT_THAT(mService->calls(), ElementsAre("registerClient", "open"));
    EXPECT_EQ(0u, frames.count());
}

TEST(TouchCompanionClientWithoutManager, FailsToInit) {
    clearLog();
    const sp<TouchCompanionClient> client = new TouchCompanionClient;
    EXPECT_EQ(STATUS_ERROR_ACQUIRING_RESOURCE, client->init());
    EXPECT_THAT(linesOf(kClientTag), ElementsAre("E couldn't get default service manager"));
}

TEST_F(TouchCompanionClientTest, FailsToInitWithoutTheService) {
    mServices->remove("pemaro.TouchService");
    const sp<TouchCompanionClient> client = new TouchCompanionClient;
    EXPECT_EQ(STATUS_ERROR_ACQUIRING_RESOURCE, client->init());
    EXPECT_EQ(1, mServices->lookups("pemaro.TouchService")) << "no retries of its own";
    EXPECT_THAT(clientLines(), ElementsAre("E couldn't find the service"));
}

TEST_F(TouchCompanionClientTest, PassesARefusedRegistrationOn) {
    mService->setStatus("registerClient", STATUS_INVALID_STATE);
    const sp<TouchCompanionClient> client = new TouchCompanionClient;
    EXPECT_EQ(STATUS_INVALID_STATE, client->init());
    EXPECT_THAT(mService->calls(), ElementsAre("registerClient"));
    EXPECT_THAT(clientLines(), ElementsAre("E registerClient failed"));
}

TEST_F(TouchCompanionClientTest, PassesARefusedOpenOn) {
    mService->setStatus("open", STATUS_ERROR_AFE_HAL);
    const sp<TouchCompanionClient> client = new TouchCompanionClient;
    EXPECT_EQ(STATUS_ERROR_AFE_HAL, client->init());
    EXPECT_THAT(mService->calls(), ElementsAre("registerClient", "open"));
    EXPECT_THAT(clientLines(), ElementsAre("E init service failed"));
}

TEST_F(TouchCompanionClientTest, RegistersAnewWhenInitialisedTwice) {
    const sp<TouchCompanionClient> client = connect();
    const sp<ITouchCompanionClient> first = mService->client;
    EXPECT_EQ(0, client->init());
    EXPECT_NE(first, mService->client);
    EXPECT_THAT(mService->calls(), ElementsAre("registerClient", "open"));
}

// ---- a service in another process ----

class RemoteTouchCompanionClientTest : public TouchCompanionClientTest {
  protected:
    void SetUp() override {
        TouchCompanionClientTest::SetUp();
        mRemote->forwardTo(mService);
        mServices->add("pemaro.TouchService", mRemote);
    }

    const sp<RecordingBinder> mRemote = new RecordingBinder("pemaro.TouchService");
};

TEST_F(RemoteTouchCompanionClientTest, CallsTheServiceThroughAProxy) {
    {
        const sp<TouchCompanionClient> client = new TouchCompanionClient;
        EXPECT_EQ(0, client->init());
    }
    std::vector<uint32_t> codes;
    for (const RecordingBinder::Transaction& transaction : mRemote->transactions()) {
        codes.push_back(transaction.code);
    }
    EXPECT_THAT(codes, ElementsAre(1, 3, 2));
}

TEST_F(RemoteTouchCompanionClientTest, FailsToInitWhenTheServiceIsDead) {
    mRemote->die();
    const sp<TouchCompanionClient> client = new TouchCompanionClient;
    EXPECT_EQ(STATUS_UNKNOWN_ERROR, client->init());
    EXPECT_THAT(clientLines(), ElementsAre("E registerClient failed"));
}

TEST_F(RemoteTouchCompanionClientTest, PingsTheService) {
    const sp<TouchCompanionClient> client = connect();
    EXPECT_EQ(1, client->pingService());
    EXPECT_EQ(1, mRemote->pings());
    mRemote->setPingResult(android::FAILED_TRANSACTION);
    EXPECT_EQ(0, client->pingService());
    mRemote->setPingResult(android::NO_ERROR);
    EXPECT_EQ(1, client->pingService());
    mRemote->die();
    EXPECT_EQ(0, client->pingService());
    EXPECT_THAT(clientLines(), IsEmpty());
}

TEST_F(TouchCompanionClientTest, PingsALocalService) {
    EXPECT_EQ(1, connect()->pingService());
}

TEST_F(TouchCompanionClientTest, HasNothingToPingBeforeInit) {
    const sp<TouchCompanionClient> client = new TouchCompanionClient;
    EXPECT_EQ(0, client->pingService());
    EXPECT_THAT(clientLines(), ElementsAre("D binder error"));
}

// ---- without a service ----

// What an operation needs is looked at before the service, which is missed only when it is called.
struct Operation {
    const char* name;
    int (*call)(TouchCompanionClient& client);
    int status;
    Lines lines;
};

const Operation kOperations[] = {
        {"setRecordOutput", [](auto& c) { return c.setRecordOutput(1); }, STATUS_INVALID_STATE, {}},
        {"setRecordFileWithoutOutput",
         [](auto& c) { return c.setRecordFile("/f"); },
         STATUS_BAD_PARAMETER,
         {"E setRecordFile can be called only with OUTPUT_FILE option"}},
        {"setRecordFile",
         [](auto& c) {
             c.setRecordOutput(0);
             return c.setRecordFile("/f");
         },
         STATUS_INVALID_STATE,
         {}},
        {"startRecordWithoutOutput",
         [](auto& c) { return c.startRecord(); },
         STATUS_BAD_PARAMETER,
         {"E recording parameter is wrong(-1)"}},
        {"startRecord",
         [](auto& c) {
             c.setRecordOutput(1);
             return c.startRecord();
         },
         STATUS_INVALID_STATE,
         {}},
        {"stopRecord",
         [](auto& c) { return c.stopRecord(); },
         STATUS_INVALID_STATE,
         {"D stopRecord: E", "D stopRecord: call stopRecord on remote side"}},
};

class TouchCompanionClientWithoutService : public TouchCompanionClientTest,
                                           public ::testing::WithParamInterface<Operation> {};

INSTANTIATE_TEST_SUITE_P(EveryOperation, TouchCompanionClientWithoutService,
                         ::testing::ValuesIn(kOperations),
                         [](const auto& info) { return info.param.name; });

TEST_P(TouchCompanionClientWithoutService, LooksAtWhatItNeedsAndMissesTheServiceThen) {
    sp<TouchCompanionClient> client = new TouchCompanionClient;
    EXPECT_EQ(GetParam().status, GetParam().call(*client)) << "before init()";
    EXPECT_EQ(GetParam().lines, clientLines());

    mServices->remove("pemaro.TouchService");
    client = new TouchCompanionClient;
    client->init();
    clearLog();
    EXPECT_EQ(GetParam().status, GetParam().call(*client)) << "after an init() that found none";
    EXPECT_EQ(GetParam().lines, clientLines());
}

// It is stored before the service is told, of which this one then has heard nothing.
TEST_F(TouchCompanionClientTest, KeepsAnOutputChosenBeforeInit) {
    const sp<TouchCompanionClient> client = new TouchCompanionClient;
    EXPECT_EQ(STATUS_INVALID_STATE, client->setRecordOutput(0));
    EXPECT_EQ(0, client->init());
    mService->clearCalls();
    EXPECT_EQ(0, client->startRecord());
    EXPECT_THAT(mService->calls(), ElementsAre("prepareRecord", "startRecord"));
}

// ---- destruction ----

TEST_F(TouchCompanionClientTest, UnregistersAndNeverCloses) {
    connect().clear();
    EXPECT_THAT(mService->calls(), ElementsAre("unregisterClient"));
}

TEST_F(TouchCompanionClientTest, CallsNothingWhenInitFailed) {
    for (const char* step : {"registerClient", "open"}) {
        const sp<FakeTouchCompanionService> service = new FakeTouchCompanionService;
        service->setStatus(step, STATUS_INVALID_STATE);
        mServices->add("pemaro.TouchService", service);
        sp<TouchCompanionClient> client = new TouchCompanionClient;
        EXPECT_EQ(STATUS_INVALID_STATE, client->init());
        service->clearCalls();
        client.clear();
        EXPECT_THAT(service->calls(), IsEmpty()) << step;
    }
}

TEST_F(TouchCompanionClientTest, CallsNothingWithoutInit) {
    sp<TouchCompanionClient>(new TouchCompanionClient).clear();
    EXPECT_THAT(mService->calls(), IsEmpty());
}

TEST_F(TouchCompanionClientTest, DropsWhatItHeld) {
    FrameRing ring(8, 64);
    sp<TouchCompanionClient> client = record(ring);
    const wp<ITouchCompanionClient> handle = mService->client;
    const wp<FakeTouchCompanionService> service = mService;
    const int32_t blockReferences = ring.memory()->getStrongCount();
    const int32_t serviceReferences = mService->getStrongCount();
    client.clear();
    EXPECT_EQ(blockReferences - 1, ring.memory()->getStrongCount());
    EXPECT_EQ(serviceReferences - 1, mService->getStrongCount());
    mService->client = nullptr;
    EXPECT_EQ(nullptr, handle.promote());
}

TEST_F(TouchCompanionClientTest, UnregistersBeforeItEndsItsThread) {
    FakeWaits waits;
    FrameRing ring(8, 64);
    Frames frames;
    sp<TouchCompanionClient> client = record(ring, Frames::callback, &frames);
    mService->onCall([&](const std::string& call) {
        if (call == "unregisterClient") {
            ring.put();
            EXPECT_TRUE(frames.waitFor(1)) << "the thread is still delivering";
        }
    });
    client.clear();
    EXPECT_EQ(1u, frames.count());
    ring.put();
    EXPECT_EQ(1u, ring.cblk().read) << "nobody takes frames any more";
}

TEST_F(TouchCompanionClientTest, FlushesBindersCommands) {
    sp<TouchCompanionClient> client = connect();
    // A reference to another process's object is a command that waits to be flushed.
    const sp<android::IBinder> foreign = android::ProcessState::self()->getStrongProxyForHandle(77);
    const int before = driverWrites();
    client.clear();
    EXPECT_EQ(before + 1, driverWrites());
}

// A service that refused to open may still let itself be recorded from; the thread must not outlive
// the client then either.
TEST_F(TouchCompanionClientTest, EndsItsThreadEvenWhenInitFailed) {
    FakeWaits waits;
    FrameRing ring(8, 64);
    Frames frames;
    mService->setStatus("open", STATUS_INVALID_STATE);
    mService->cblk = ring.memory();
    sp<TouchCompanionClient> client = new TouchCompanionClient(Frames::callback, &frames);
    EXPECT_EQ(STATUS_INVALID_STATE, client->init());
    EXPECT_EQ(0, client->setRecordOutput(1));
    EXPECT_EQ(0, client->startRecord());
    ring.put();
    EXPECT_TRUE(frames.waitFor(1));
    mService->clearCalls();
    client.clear();
    EXPECT_THAT(mService->calls(), IsEmpty());
    EXPECT_EQ(1u, frames.count());
}

}  // namespace
}  // namespace pemaro::test
