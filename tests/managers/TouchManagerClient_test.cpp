// SPDX-License-Identifier: Apache-2.0
#include "pemaro/TouchManagerClient.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cstdlib>
#include <string>
#include <vector>

#include "pemaro/Status.h"
#include "pemaro/testkit/FakeServiceManager.h"
#include "tests/managers/ManagerParcels.h"
#include "tests/managers/RecordingManagers.h"
#include "tests/support/FakeWaits.h"
#include "tests/support/LogLines.h"
#include "tests/support/RecordingBinder.h"

namespace pemaro::test {
namespace {

using android::Parcel;
using android::sp;
using ::testing::ElementsAre;
using ::testing::IsEmpty;
using ::testing::SizeIs;

using TouchGesture = ITouchManagerClient::GestureData;

constexpr char kService[] = "pemaro.TouchManagerService";
constexpr char kTag[] = "TouchManagerClient";

struct Event {
    char callback;
    TouchGesture* record;
    void* context;
};

bool operator==(const Event& a, const Event& b) {
    return a.callback == b.callback && a.record == b.record && a.context == b.context;
}

std::vector<Event> gTouchEvents;

void callbackA(TouchGesture* record, void* context) {
    gTouchEvents.push_back({'A', record, context});
}

void callbackB(TouchGesture* record, void* context) {
    gTouchEvents.push_back({'B', record, context});
}

std::string eventLine(const TouchManagerClient* client) {
    return withAddress("E Gesture event detected (client address = %p)", client);
}

class TouchManagerClientTest : public ::testing::Test {
  protected:
    void SetUp() override {
        // The callback and the context outlive the clients of other tests.
        const sp<TouchManagerClient> forget = new TouchManagerClient(nullptr, nullptr);
        gTouchEvents.clear();
        mRemote->answer(numbers({0}));
        clearLog();
    }

    void addService() { mServices->add(kService, mRemote); }

    sp<TouchManagerClient> connect(TouchManagerClient::GestureCallback callback, void* context) {
        addService();
        const sp<TouchManagerClient> client = new TouchManagerClient(callback, context);
        EXPECT_EQ(0, client->init());
        mRemote->clearTransactions();
        clearLog();
        return client;
    }

    std::vector<uint32_t> codes() const { return codesOf(mRemote); }

    static Bytes requestWith(const sp<TouchManagerClient>& client) {
        return requestBytes(kService, [&](Parcel& p) { p.writeStrongBinder(client); });
    }

    ScopedServiceManager mServices;
    const sp<RecordingBinder> mRemote = new RecordingBinder;
    int mContext = 0;
};

// ---- construction ----

TEST_F(TouchManagerClientTest, LogsItsConstructionAndDestruction) {
    for (bool withCallback : {true, false}) {
        clearLog();
        sp<TouchManagerClient> client = withCallback ? new TouchManagerClient(callbackA, &mContext)
                                                     : new TouchManagerClient;
        const void* address = client.get();
        client.clear();
        EXPECT_EQ((Lines{withAddress("D TouchManagerClient(): this = %p", address),
                         withAddress("D ~TouchManagerClient: E: this = %p", address),
                         "D ~TouchManagerClient(): X"}),
                  linesOf(kTag));
    }
}

TEST(TouchManagerClientDeathTest, HasNoCallbackWhenTheLibraryIsLoaded) {
    // In a process of its own, where no client was constructed before.
    ::testing::FLAGS_gtest_death_test_style = "threadsafe";
    EXPECT_EXIT(
            {
                const sp<TouchManagerClient> client = new TouchManagerClient;
                clearLog();
                client->gestureCallback(nullptr);
                exit(linesOf(kTag) == Lines{eventLine(client.get()), "E callback is null"} ? 0 : 1);
            },
            ::testing::ExitedWithCode(0), "");
}

// ---- init ----

TEST_F(TouchManagerClientTest, SubscribesItself) {
    addService();
    const sp<TouchManagerClient> client = new TouchManagerClient(callbackA, &mContext);
    clearLog();
    EXPECT_EQ(0, client->init());
    EXPECT_EQ((Lines{"D init: E", "D before subscribe: mTchMgrClient ref count = 1",
                     "D after subscribe: mTchMgrClient ref count = 1", "E Init successful: X"}),
              linesOf(kTag));
    ASSERT_THAT(codes(), ElementsAre(kSubscribe));
    EXPECT_EQ(requestWith(client), mRemote->lastTransaction().request);
    EXPECT_EQ(1, mServices->lookups(kService));
    EXPECT_EQ(0, mRemote->linkCalls());
}

TEST_F(TouchManagerClientTest, CountsTheReferenceThatTheServiceKeeps) {
    const sp<RecordingTouchManagerService> service = new RecordingTouchManagerService;
    mServices->add(kService, service);
    const sp<TouchManagerClient> client = new TouchManagerClient;
    clearLog();
    EXPECT_EQ(0, client->init());
    EXPECT_EQ(Recording::Calls{"subscribe(object)"}, service->calls);
    EXPECT_THAT(service->clients, ElementsAre(client));
    EXPECT_EQ((Lines{"D init: E", "D before subscribe: mTchMgrClient ref count = 1",
                     "D after subscribe: mTchMgrClient ref count = 2", "E Init successful: X"}),
              linesOf(kTag));
    service->clients.clear();  // the two held each other
}

TEST_F(TouchManagerClientTest, AsksForTheServiceOnce) {
    FakeWaits waits;
    const sp<TouchManagerClient> client = new TouchManagerClient;
    clearLog();
    EXPECT_EQ(STATUS_ERROR_ACQUIRING_RESOURCE, client->init());
    EXPECT_EQ((Lines{"D init: E", "E couldn't find the service"}), linesOf(kTag));
    EXPECT_EQ(1, mServices->lookups(kService));
    EXPECT_THAT(waits.sleeps(), IsEmpty());
}

TEST(TouchManagerClientAlone, NeedsAServiceManager) {
    const sp<TouchManagerClient> client = new TouchManagerClient;
    clearLog();
    EXPECT_EQ(STATUS_ERROR_ACQUIRING_RESOURCE, client->init());
    EXPECT_EQ((Lines{"D init: E", "E couldn't get default service manager"}), linesOf(kTag));
}

TEST_F(TouchManagerClientTest, KeepsTheServiceThatRefusesIt) {
    addService();
    mRemote->answer(numbers({STATUS_BROKEN_PIPE}));
    const sp<TouchManagerClient> client = new TouchManagerClient;
    clearLog();
    EXPECT_EQ(STATUS_BROKEN_PIPE, client->init());
    EXPECT_EQ((Lines{"D init: E", "D before subscribe: mTchMgrClient ref count = 1",
                     "D after subscribe: mTchMgrClient ref count = 1",
                     "E subscribing to service failed"}),
              linesOf(kTag));
    // Its features can be used, and nothing is there to unsubscribe.
    mRemote->answer(numbers({0}));
    mRemote->clearTransactions();
    EXPECT_EQ(0, client->enable(3));
    EXPECT_EQ(0, client->deinit());
    EXPECT_EQ(0, client->enable(3));
    EXPECT_THAT(codes(), ElementsAre(5u, 5u));
}

TEST_F(TouchManagerClientTest, FailsWhenSubscribingCannotBeSent) {
    addService();
    mRemote->fail(android::DEAD_OBJECT);
    const sp<TouchManagerClient> client = new TouchManagerClient;
    EXPECT_EQ(STATUS_UNKNOWN_ERROR, client->init());
}

TEST_F(TouchManagerClientTest, SubscribesAgainWhenInitialisedAgain) {
    const sp<TouchManagerClient> client = connect(callbackA, &mContext);
    EXPECT_EQ(0, client->init());
    EXPECT_EQ(requestWith(client), mRemote->lastTransaction().request);
    mRemote->answer(numbers({STATUS_UNSUPPORTED}));
    EXPECT_EQ(STATUS_UNSUPPORTED, client->init());
    EXPECT_THAT(codes(), ElementsAre(kSubscribe, kSubscribe));
    // It is still subscribed from before.
    EXPECT_EQ(0, client->deinit());
    EXPECT_THAT(codes(), ElementsAre(kSubscribe, kSubscribe, kUnsubscribe));
}

// ---- deinit ----

// While the old service is told, a client is connected to a new one: deinit() ends what it began with.
TEST_F(TouchManagerClientTest, DeinitLeavesAServiceAloneThatCameMeanwhile) {
    const sp<TouchManagerClient> client = connect(callbackA, &mContext);
    const sp<RecordingBinder> successor = new RecordingBinder;
    successor->answer(numbers({0}));
    mRemote->handle([&](uint32_t, const Parcel&, Parcel* reply) {
        mServices->add(kService, successor);
        EXPECT_EQ(0, client->init());
        return reply->writeInt32(0);
    });
    EXPECT_EQ(0, client->deinit());
    EXPECT_THAT(codes(), ElementsAre(kUnsubscribe));
    EXPECT_THAT(codesOf(successor), ElementsAre(kSubscribe));

    EXPECT_EQ(0, client->deinit());
    EXPECT_THAT(codesOf(successor), ElementsAre(kSubscribe, kUnsubscribe));
}

TEST_F(TouchManagerClientTest, UnsubscribesItself) {
    const sp<TouchManagerClient> client = connect(callbackA, &mContext);
    EXPECT_EQ(0, client->deinit());
    EXPECT_EQ((Lines{"D deinit: E", "D deinit: X"}), linesOf(kTag));
    ASSERT_THAT(codes(), ElementsAre(kUnsubscribe));
    EXPECT_EQ(requestWith(client), mRemote->lastTransaction().request);
    // Once: the service was let go.
    EXPECT_EQ(0, client->deinit());
    EXPECT_THAT(codes(), SizeIs(1));
    EXPECT_EQ(STATUS_INVALID_STATE, client->enable(1));
}

TEST_F(TouchManagerClientTest, DoesNotMindAFailureToUnsubscribe) {
    const sp<TouchManagerClient> client = connect(callbackA, &mContext);
    mRemote->fail(android::DEAD_OBJECT);
    EXPECT_EQ(0, client->deinit());
    EXPECT_EQ(STATUS_INVALID_STATE, client->enable(1));
}

TEST_F(TouchManagerClientTest, CallsNobodyWhenItWasNeverInitialised) {
    addService();
    const sp<TouchManagerClient> client = new TouchManagerClient;
    clearLog();
    EXPECT_EQ(0, client->deinit());
    EXPECT_EQ((Lines{"D deinit: E", "D deinit: X"}), linesOf(kTag));
    EXPECT_THAT(mRemote->transactions(), IsEmpty());
    EXPECT_EQ(0, mServices->lookups(kService));
}

TEST_F(TouchManagerClientTest, CanBeInitialisedAnew) {
    const sp<TouchManagerClient> client = connect(callbackA, &mContext);
    client->deinit();
    EXPECT_EQ(0, client->init());
    EXPECT_THAT(codes(), ElementsAre(kUnsubscribe, kSubscribe));
}

TEST_F(TouchManagerClientTest, DoesNotUnsubscribeWhenDestroyed) {
    sp<TouchManagerClient> client = connect(callbackA, &mContext);
    const int held = mRemote->getStrongCount();
    client.clear();
    EXPECT_THAT(mRemote->transactions(), IsEmpty());
    EXPECT_EQ(held - 1, mRemote->getStrongCount());
}

// ---- gestures ----

TEST_F(TouchManagerClientTest, HandsGesturesToTheCallback) {
    const sp<TouchManagerClient> client = connect(callbackA, &mContext);
    TouchGesture record;
    EXPECT_EQ(0, client->gestureCallback(&record));
    EXPECT_EQ(0, client->gestureCallback(nullptr));
    EXPECT_THAT(gTouchEvents,
                ElementsAre(Event{'A', &record, &mContext}, Event{'A', nullptr, &mContext}));
    EXPECT_EQ((Lines{eventLine(client.get()), eventLine(client.get())}), linesOf(kTag));
    EXPECT_THAT(mRemote->transactions(), IsEmpty());
}

TEST_F(TouchManagerClientTest, HandsOnTheRecordThatLiesInTheRequest) {
    const sp<TouchManagerClient> client = connect(callbackA, &mContext);
    Parcel data;
    Parcel reply;
    writeToken(data, "pemaro.TouchManagerClient");
    writeRecords<TouchGesture>(data, 1);
    EXPECT_EQ(android::NO_ERROR, client->transact(1, data, &reply));
    ASSERT_THAT(gTouchEvents, SizeIs(1));
    EXPECT_EQ(data.data() + data.dataSize() - sizeof(TouchGesture),
              reinterpret_cast<const uint8_t*>(gTouchEvents[0].record));
    EXPECT_TRUE(holdsRecords(gTouchEvents[0].record, 1));
    EXPECT_EQ(parcelBytes(numbers({0})), bytesOf(reply));
}

TEST_F(TouchManagerClientTest, SharesTheCallbackOfTheLastClient) {
    int contextB = 0;
    const sp<TouchManagerClient> first = new TouchManagerClient(callbackA, &mContext);
    const sp<TouchManagerClient> second = new TouchManagerClient(callbackB, &contextB);
    const sp<TouchManagerClient> third = new TouchManagerClient;
    TouchGesture record;
    for (const sp<TouchManagerClient>& client : {first, second, third}) {
        gTouchEvents.clear();
        EXPECT_EQ(0, client->gestureCallback(&record));
        EXPECT_THAT(gTouchEvents, ElementsAre(Event{'B', &record, &contextB}));
    }
}

TEST_F(TouchManagerClientTest, DropsGesturesWithoutACallback) {
    const sp<TouchManagerClient> client = connect(nullptr, &mContext);
    EXPECT_EQ(0, client->gestureCallback(nullptr));
    EXPECT_EQ((Lines{eventLine(client.get()), "E callback is null"}), linesOf(kTag));
    EXPECT_THAT(mRemote->transactions(), IsEmpty());
}

TEST_F(TouchManagerClientTest, UnsubscribesAtEveryGestureWithoutAContext) {
    const sp<TouchManagerClient> client = connect(callbackA, nullptr);
    for (int i = 0; i < 2; ++i) {
        clearLog();
        EXPECT_EQ(0, client->gestureCallback(nullptr));
        EXPECT_EQ((Lines{eventLine(client.get()), "E JNI context is null...unsubscribing client"}),
                  linesOf(kTag));
        EXPECT_EQ(requestWith(client), mRemote->lastTransaction().request);
    }
    EXPECT_THAT(gTouchEvents, IsEmpty());
    // The client does not count itself as unsubscribed.
    client->deinit();
    EXPECT_THAT(codes(), ElementsAre(kUnsubscribe, kUnsubscribe, kUnsubscribe));
}

TEST_F(TouchManagerClientTest, IgnoresAGestureWithoutAContextAndAService) {
    const sp<TouchManagerClient> client = new TouchManagerClient(callbackA, nullptr);
    clearLog();
    EXPECT_EQ(0, client->gestureCallback(nullptr));
    EXPECT_EQ((Lines{eventLine(client.get()), "E JNI context is null...unsubscribing client"}),
              linesOf(kTag));
}

}  // namespace
}  // namespace pemaro::test
