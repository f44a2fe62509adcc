// SPDX-License-Identifier: Apache-2.0
// The connection of the clients that watch their service, the gesture and the hand biometric
// manager's: lookup, subscription, events, death.

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <chrono>
#include <functional>
#include <string>
#include <thread>
#include <vector>

#include "pemaro/GestureManagerClient.h"
#include "pemaro/HandBiometricManagerClient.h"
#include "pemaro/Status.h"
#include "pemaro/testkit/FakeServiceManager.h"
#include "tests/managers/ManagerParcels.h"
#include "tests/support/FakeWaits.h"
#include "tests/support/LogLines.h"
#include "tests/support/RecordingBinder.h"

namespace pemaro::test {
namespace {

using android::IBinder;
using android::Parcel;
using android::sp;
using ::testing::Each;
using ::testing::ElementsAre;
using ::testing::IsEmpty;
using ::testing::SizeIs;

// What distinguishes the two clients.

struct GestureCase {
    using Client = GestureManagerClient;
    using Record = IGestureManagerClient::GestureData;
    static constexpr char kService[] = "pemaro.GestureManagerService";
    static constexpr char kCallback[] = "pemaro.GestureManagerClient";
    static constexpr char kServiceTag[] = "IGestureManagerService";
    static constexpr char kTag[] = "GestureManagerClient";
    static constexpr char kConnected[] = "E Init successful: X";
    static constexpr char kLinkFailed[] = "E failed to link to gesture manager service death";
    static constexpr char kDied[] = "E Gesture Manager Service died!";
    static constexpr char kCallbackMissing[] = "E callback is null";

    static int deliver(Client& client, Record* record) { return client.gestureCallback(record); }
    static std::string eventLine(const Client* client) {
        return withAddress("E Gesture event detected (client address = %p)", client);
    }
    static Lines destruction(const void*) {
        return {"D ~GestureManagerClient: E", "D ~GestureManagerClient(): X"};
    }
};

struct HandCase {
    using Client = HandBiometricManagerClient;
    using Record = IHandBiometricManagerClient::HandBioData;
    static constexpr char kService[] = "pemaro.HandBiometricManagerService";
    static constexpr char kCallback[] = "pemaro.HandBiometricManagerClient";
    static constexpr char kServiceTag[] = "IHandBiometricManagerService";
    static constexpr char kTag[] = "HandBiometricManagerClient";
    static constexpr char kConnected[] = "E Init successful";
    static constexpr char kLinkFailed[] = "E failed to link to HB manager service death";
    static constexpr char kDied[] = "E HB Manager Service died!";
    static constexpr char kCallbackMissing[] = "E handBiometricCallback is null";

    static int deliver(Client& client, Record* record) {
        return client.handBiometricCallback(record);
    }
    static std::string eventLine(const Client*) {
        return "E handBiometricCallback: HandBiometric event detected";
    }
    static Lines destruction(const void* address) {
        return {withAddress("D ~HandBiometricManagerClient: E: this = %p", address),
                "D ~HandBiometricManagerClient(): X"};
    }
};

constexpr char kContextMissing[] = "E JNI context is null...unsubscribing client";

// What the caller's functions were called with; the context is the one that they are told.
struct Caller {
    std::vector<void*> records;
    int deaths = 0;
    std::function<void()> onDeath;
};

template <typename Record>
void noteEvent(Record* record, void* context) {
    static_cast<Caller*>(context)->records.push_back(record);
}

void noteDeath(void* context) {
    Caller& caller = *static_cast<Caller*>(context);
    ++caller.deaths;
    if (caller.onDeath) {
        caller.onDeath();
    }
}

template <typename T>
class WatchedManagerClient : public ::testing::Test {
  protected:
    using Client = typename T::Client;
    using Record = typename T::Record;

    void SetUp() override {
        mRemote->answer(numbers({0}));
        clearLog();
    }

    void addService() { mServices->add(T::kService, mRemote); }

    sp<Client> makeClient() { return new Client(noteEvent<Record>, noteDeath, &mCaller); }

    sp<Client> connect(const sp<Client>& client) {
        addService();
        EXPECT_EQ(0, client->init());
        mRemote->clearTransactions();
        clearLog();
        return client;
    }

    std::vector<uint32_t> codes() const { return codesOf(mRemote); }
    static Lines lines() { return linesOf(T::kTag); }

    static Bytes requestWith(const sp<Client>& client) {
        return requestBytes(T::kService, [&](Parcel& p) { p.writeStrongBinder(client); });
    }

    static Lines attempts(int count) {
        Lines lines = {"D init: E"};
        for (int i = 0; i < count; ++i) {
            lines.push_back("D get service attempt #" + std::to_string(i) +
                            " of 10...couldn't find service");
        }
        return lines;
    }

    static int operation(const sp<Client>& client) { return client->enableWakeup(); }

    ScopedServiceManager mServices;
    const sp<RecordingBinder> mRemote = new RecordingBinder;
    Caller mCaller;
};

using WatchedCases = ::testing::Types<GestureCase, HandCase>;
TYPED_TEST_SUITE(WatchedManagerClient, WatchedCases);

// ---- init ----

TYPED_TEST(WatchedManagerClient, SubscribesItselfThenWatchesTheService) {
    this->addService();
    const auto client = this->makeClient();
    std::vector<int> linksAtSubscription;
    this->mRemote->handle([&](uint32_t, const Parcel&, Parcel* reply) {
        linksAtSubscription.push_back(this->mRemote->linkCalls());
        reply->writeInt32(0);
        return android::NO_ERROR;
    });
    EXPECT_EQ(0, client->init());
    EXPECT_EQ((Lines{"D init: E", TypeParam::kConnected}), this->lines());
    ASSERT_THAT(this->codes(), ElementsAre(kSubscribe));
    EXPECT_EQ(this->requestWith(client), this->mRemote->lastTransaction().request);
    EXPECT_THAT(linksAtSubscription, ElementsAre(0));
    const auto links = this->mRemote->links();
    ASSERT_THAT(links, SizeIs(1));
    EXPECT_EQ(sp<IBinder::DeathRecipient>(client), links[0].recipient.promote());
    EXPECT_EQ(nullptr, links[0].cookie);
    EXPECT_EQ(0u, links[0].flags);
    EXPECT_EQ(1, this->mServices->lookups(TypeParam::kService));
}

TYPED_TEST(WatchedManagerClient, LooksForTheServiceTenTimes) {
    FakeWaits waits;
    const auto client = this->makeClient();
    EXPECT_EQ(STATUS_ERROR_ACQUIRING_RESOURCE, client->init());
    Lines expected = this->attempts(10);
    expected.push_back("E couldn't find service");
    EXPECT_EQ(expected, this->lines());
    EXPECT_EQ(10, this->mServices->lookups(TypeParam::kService));
    EXPECT_THAT(waits.sleeps(), SizeIs(10));
    EXPECT_THAT(waits.sleeps(), Each(500000u));
    EXPECT_EQ(STATUS_INVALID_STATE, this->operation(client));
}

TYPED_TEST(WatchedManagerClient, FindsAServiceThatAppearsInTheThirdSleep) {
    FakeWaits waits;
    waits.onSleep([&](int number) {
        if (number == 3) {
            this->addService();
        }
    });
    const auto client = this->makeClient();
    EXPECT_EQ(0, client->init());
    Lines expected = this->attempts(3);
    expected.push_back(TypeParam::kConnected);
    EXPECT_EQ(expected, this->lines());
    EXPECT_EQ(4, this->mServices->lookups(TypeParam::kService));
    EXPECT_THAT(waits.sleeps(), SizeIs(3));
}

TYPED_TEST(WatchedManagerClient, MissesAServiceThatAppearsInTheTenthSleep) {
    FakeWaits waits;
    waits.onSleep([&](int number) {
        if (number == 10) {
            this->addService();
        }
    });
    EXPECT_EQ(STATUS_ERROR_ACQUIRING_RESOURCE, this->makeClient()->init());
    EXPECT_THAT(this->mRemote->transactions(), IsEmpty());
}

TYPED_TEST(WatchedManagerClient, ForgetsTheServiceThatRefusesIt) {
    this->addService();
    this->mRemote->answer(numbers({STATUS_BROKEN_PIPE}));
    const auto client = this->makeClient();
    EXPECT_EQ(STATUS_BROKEN_PIPE, client->init());
    EXPECT_EQ((Lines{"D init: E", "E subscribing to service failed"}), this->lines());
    EXPECT_EQ(0, this->mRemote->linkCalls());
    EXPECT_EQ(STATUS_INVALID_STATE, this->operation(client));
    EXPECT_EQ(0, client->deinit());
    EXPECT_THAT(this->codes(), ElementsAre(kSubscribe));
}

TYPED_TEST(WatchedManagerClient, UnsubscribesFromAServiceThatCannotBeWatched) {
    this->addService();
    this->mRemote->setLinkResult(android::INVALID_OPERATION);
    const auto client = this->makeClient();
    EXPECT_EQ(STATUS_UNKNOWN_ERROR, client->init());
    EXPECT_EQ((Lines{"D init: E", TypeParam::kLinkFailed}), this->lines());
    ASSERT_THAT(this->codes(), ElementsAre(kSubscribe, kUnsubscribe));
    EXPECT_EQ(this->requestWith(client), this->mRemote->lastTransaction().request);
    EXPECT_EQ(STATUS_INVALID_STATE, this->operation(client));
    EXPECT_EQ(0, client->deinit());
    EXPECT_THAT(this->codes(), SizeIs(2));
    EXPECT_EQ(0, this->mRemote->unlinkCalls());
}

TYPED_TEST(WatchedManagerClient, CannotWatchAServiceThatDiedMeanwhile) {
    this->addService();
    this->mRemote->handle([&](uint32_t code, const Parcel&, Parcel* reply) {
        reply->writeInt32(0);
        if (code == kSubscribe) {
            this->mRemote->die();
        }
        return android::NO_ERROR;
    });
    const auto client = this->makeClient();
    EXPECT_EQ(STATUS_UNKNOWN_ERROR, client->init());
    EXPECT_EQ((Lines{"D init: E", TypeParam::kLinkFailed}), this->lines());
    EXPECT_EQ(0, this->mCaller.deaths);
}

TYPED_TEST(WatchedManagerClient, SubscribesAgainWhenInitialisedAgain) {
    const auto client = this->connect(this->makeClient());
    EXPECT_EQ(0, client->init());
    EXPECT_THAT(this->codes(), ElementsAre(kSubscribe));
    EXPECT_EQ(2, this->mRemote->linkCalls());
}

// ---- deinit ----

TYPED_TEST(WatchedManagerClient, UnsubscribesThenEndsTheWatch) {
    const auto client = this->connect(this->makeClient());
    std::vector<int> unlinksAtUnsubscription;
    this->mRemote->handle([&](uint32_t, const Parcel&, Parcel* reply) {
        unlinksAtUnsubscription.push_back(this->mRemote->unlinkCalls());
        reply->writeInt32(STATUS_TIMEOUT);
        return android::NO_ERROR;
    });
    EXPECT_EQ(0, client->deinit());
    EXPECT_EQ((Lines{"D deinit: E", "D deinit: X"}), this->lines());
    ASSERT_THAT(this->codes(), ElementsAre(kUnsubscribe));
    EXPECT_EQ(this->requestWith(client), this->mRemote->lastTransaction().request);
    EXPECT_THAT(unlinksAtUnsubscription, ElementsAre(0));
    EXPECT_EQ(1, this->mRemote->unlinkCalls());
    EXPECT_THAT(this->mRemote->links(), IsEmpty());

    EXPECT_EQ(STATUS_INVALID_STATE, this->operation(client));
    EXPECT_EQ(0, client->deinit());
    EXPECT_THAT(this->codes(), SizeIs(1));
    EXPECT_EQ(1, this->mRemote->unlinkCalls());
    this->mRemote->die();
    EXPECT_EQ(0, this->mCaller.deaths);
}

TYPED_TEST(WatchedManagerClient, CallsNobodyWhenItWasNeverInitialised) {
    this->addService();
    const auto client = this->makeClient();
    EXPECT_EQ(0, client->deinit());
    EXPECT_EQ((Lines{"D deinit: E", "D deinit: X"}), this->lines());
    EXPECT_THAT(this->mRemote->transactions(), IsEmpty());
    EXPECT_EQ(0, this->mRemote->unlinkCalls());
}

// ---- events ----

TYPED_TEST(WatchedManagerClient, HandsEventsToTheCallback) {
    const auto client = this->connect(this->makeClient());
    typename TypeParam::Record record;
    EXPECT_EQ(0, TypeParam::deliver(*client, &record));
    EXPECT_EQ(0, TypeParam::deliver(*client, nullptr));
    EXPECT_THAT(this->mCaller.records, ElementsAre(&record, nullptr));
    EXPECT_EQ((Lines{TypeParam::eventLine(client.get()), TypeParam::eventLine(client.get())}),
              this->lines());
    EXPECT_THAT(this->mRemote->transactions(), IsEmpty());
}

TYPED_TEST(WatchedManagerClient, HandsOnTheRecordThatLiesInTheRequest) {
    using Record = typename TypeParam::Record;
    const auto client = this->makeClient();
    Parcel data;
    Parcel reply;
    writeToken(data, TypeParam::kCallback);
    writeRecords<Record>(data, 1);
    EXPECT_EQ(android::NO_ERROR, client->transact(1, data, &reply));
    ASSERT_THAT(this->mCaller.records, SizeIs(1));
    EXPECT_EQ(data.data() + data.dataSize() - sizeof(Record), this->mCaller.records[0]);
    EXPECT_TRUE(holdsRecords(static_cast<Record*>(this->mCaller.records[0]), 1));
    EXPECT_EQ(parcelBytes(numbers({0})), bytesOf(reply));
}

TYPED_TEST(WatchedManagerClient, HasACallbackAndContextOfItsOwn) {
    using Client = typename TypeParam::Client;
    Caller other;
    const auto first = this->makeClient();
    const sp<Client> second = new Client(noteEvent<typename TypeParam::Record>, noteDeath, &other);
    TypeParam::deliver(*first, nullptr);
    EXPECT_THAT(this->mCaller.records, SizeIs(1));
    EXPECT_THAT(other.records, IsEmpty());
}

TYPED_TEST(WatchedManagerClient, DropsEventsWithoutACallback) {
    using Client = typename TypeParam::Client;
    const auto client = this->connect(new Client(nullptr, noteDeath, &this->mCaller));
    EXPECT_EQ(0, TypeParam::deliver(*client, nullptr));
    EXPECT_EQ((Lines{TypeParam::eventLine(client.get()), TypeParam::kCallbackMissing}),
              this->lines());
    EXPECT_THAT(this->mRemote->transactions(), IsEmpty());
}

TYPED_TEST(WatchedManagerClient, UnsubscribesAtEveryEventWithoutAContext) {
    using Client = typename TypeParam::Client;
    const auto client =
            this->connect(new Client(noteEvent<typename TypeParam::Record>, noteDeath, nullptr));
    for (int i = 0; i < 2; ++i) {
        clearLog();
        EXPECT_EQ(0, TypeParam::deliver(*client, nullptr));
        EXPECT_EQ((Lines{TypeParam::eventLine(client.get()), kContextMissing}), this->lines());
        EXPECT_EQ(this->requestWith(client), this->mRemote->lastTransaction().request);
    }
    // The client does not count itself as unsubscribed.
    client->deinit();
    EXPECT_THAT(this->codes(), ElementsAre(kUnsubscribe, kUnsubscribe, kUnsubscribe));
}

TYPED_TEST(WatchedManagerClient, DropsEverythingWhenMadeWithoutArguments) {
    using Client = typename TypeParam::Client;
    const sp<Client> client = new Client;
    EXPECT_THAT(this->lines(), IsEmpty());
    EXPECT_EQ(0, TypeParam::deliver(*client, nullptr));
    client->binderDied(nullptr);
    EXPECT_EQ((Lines{TypeParam::eventLine(client.get()), TypeParam::kCallbackMissing,
                     TypeParam::kDied, "E callback is null"}),
              this->lines());
}

TYPED_TEST(WatchedManagerClient, NeedsNoServiceToDropWhatHasNoContext) {
    using Client = typename TypeParam::Client;
    const sp<Client> client = new Client(noteEvent<typename TypeParam::Record>, noteDeath, nullptr);
    EXPECT_EQ(0, TypeParam::deliver(*client, nullptr));
    client->binderDied(nullptr);
    EXPECT_EQ((Lines{TypeParam::eventLine(client.get()), kContextMissing, TypeParam::kDied,
                     kContextMissing}),
              this->lines());
}

// ---- death ----

TYPED_TEST(WatchedManagerClient, TellsTheCallerOnceThatTheServiceDied) {
    const auto client = this->connect(this->makeClient());
    this->mRemote->die();
    EXPECT_EQ(1, this->mCaller.deaths);
    EXPECT_EQ((Lines{TypeParam::kDied}), this->lines());
    EXPECT_THAT(this->mRemote->transactions(), IsEmpty());
    // The client stays as it is until it is told otherwise.
    EXPECT_EQ(STATUS_UNKNOWN_ERROR, this->operation(client));
}

TYPED_TEST(WatchedManagerClient, DropsADeathWithoutACallback) {
    using Client = typename TypeParam::Client;
    const auto client = this->connect(
            new Client(noteEvent<typename TypeParam::Record>, nullptr, &this->mCaller));
    this->mRemote->die();
    EXPECT_EQ((Lines{TypeParam::kDied, "E callback is null"}), this->lines());
    EXPECT_THAT(this->mRemote->transactions(), IsEmpty());
}

TYPED_TEST(WatchedManagerClient, TriesToUnsubscribeAtADeathWithoutAContext) {
    using Client = typename TypeParam::Client;
    const auto client =
            this->connect(new Client(noteEvent<typename TypeParam::Record>, noteDeath, nullptr));
    this->mRemote->die();
    EXPECT_EQ((Lines{TypeParam::kDied, kContextMissing}), this->lines());
    EXPECT_THAT(this->codes(), ElementsAre(kUnsubscribe));
    EXPECT_EQ((Lines{"D Bp: unsubscribe", "E unsubscribe() error: Broken pipe"}),
              linesOf(TypeParam::kServiceTag));
}

TYPED_TEST(WatchedManagerClient, ReconnectsByDeinitAndInit) {
    const auto client = this->connect(this->makeClient());
    this->mRemote->die();
    EXPECT_EQ(0, client->deinit());
    EXPECT_THAT(this->codes(), ElementsAre(kUnsubscribe));
    EXPECT_EQ(1, this->mRemote->unlinkCalls());
    EXPECT_EQ(STATUS_INVALID_STATE, this->operation(client));

    const sp<RecordingBinder> restarted = new RecordingBinder;
    restarted->answer(numbers({0}));
    this->mServices->add(TypeParam::kService, restarted);
    EXPECT_EQ(0, client->init());
    EXPECT_THAT(codesOf(restarted), ElementsAre(kSubscribe));
    EXPECT_EQ(0, this->operation(client));
    restarted->die();
    EXPECT_EQ(2, this->mCaller.deaths);
}

TYPED_TEST(WatchedManagerClient, ReconnectsFromTheDeathCallback) {
    const auto client = this->connect(this->makeClient());
    const sp<RecordingBinder> restarted = new RecordingBinder;
    restarted->answer(numbers({0}));
    this->mCaller.onDeath = [&] {
        this->mServices->add(TypeParam::kService, restarted);
        EXPECT_EQ(0, client->deinit());
        EXPECT_EQ(0, client->init());
    };
    this->mRemote->die();
    EXPECT_EQ(1, this->mCaller.deaths);
    EXPECT_EQ(0, this->operation(client));
    EXPECT_THAT(restarted->links(), SizeIs(1));
}

TYPED_TEST(WatchedManagerClient, HearsOfADeathOnAnotherThread) {
    const auto client = this->connect(this->makeClient());
    std::thread binder([&] { this->mRemote->die(); });
    binder.join();
    EXPECT_EQ(1, this->mCaller.deaths);
}

// A callback may come in on the thread that waits for an operation's reply, and let go of the
// service.
TYPED_TEST(WatchedManagerClient, HoldsTheServiceUntilAnOperationReturns) {
    sp<RecordingBinder> remote = new RecordingBinder;
    remote->answer(numbers({0}));
    this->mServices->add(TypeParam::kService, remote);
    const auto client = this->makeClient();
    ASSERT_EQ(0, client->init());

    const android::wp<RecordingBinder> watch = remote;
    remote->handle([&](uint32_t code, const Parcel&, Parcel* reply) {
        if (code != kUnsubscribe) {
            client->deinit();
            EXPECT_NE(nullptr, watch.promote());
        }
        reply->writeInt32(STATUS_NOT_FOUND);
        return android::NO_ERROR;
    });
    this->mServices->remove(TypeParam::kService);
    remote.clear();
    EXPECT_EQ(STATUS_NOT_FOUND, this->operation(client));
    EXPECT_EQ(nullptr, watch.promote());
    EXPECT_EQ(STATUS_INVALID_STATE, this->operation(client));
}

// ---- destruction ----

TYPED_TEST(WatchedManagerClient, NeitherUnsubscribesNorUnlinksWhenDestroyed) {
    auto client = this->connect(this->makeClient());
    const void* address = client.get();
    const int held = this->mRemote->getStrongCount();
    client.clear();
    EXPECT_EQ(TypeParam::destruction(address), this->lines());
    EXPECT_THAT(this->mRemote->transactions(), IsEmpty());
    EXPECT_EQ(0, this->mRemote->unlinkCalls());
    EXPECT_EQ(held - 1, this->mRemote->getStrongCount());
    // The watch alone does not keep a client.
    this->mRemote->die();
    EXPECT_EQ(0, this->mCaller.deaths);
}

// ---- without a service manager, and with the real pause ----

template <typename T>
class WatchedManagerClientAlone : public ::testing::Test {};
TYPED_TEST_SUITE(WatchedManagerClientAlone, WatchedCases);

TYPED_TEST(WatchedManagerClientAlone, NeedsAServiceManager) {
    FakeWaits waits;
    const sp<typename TypeParam::Client> client = new typename TypeParam::Client;
    clearLog();
    EXPECT_EQ(STATUS_ERROR_ACQUIRING_RESOURCE, client->init());
    EXPECT_EQ((Lines{"D init: E", "E couldn't get default service manager"}),
              linesOf(TypeParam::kTag));
    EXPECT_THAT(waits.sleeps(), IsEmpty());
}

TEST(WatchedManagerClientPause, TakesFiveSecondsInAll) {
    ScopedServiceManager services;
    const sp<GestureManagerClient> client = new GestureManagerClient;
    const auto start = std::chrono::steady_clock::now();
    EXPECT_EQ(STATUS_ERROR_ACQUIRING_RESOURCE, client->init());
    const auto took = std::chrono::steady_clock::now() - start;
    EXPECT_LE(std::chrono::milliseconds(5000), took);
    EXPECT_GE(std::chrono::seconds(60), took);
}

}  // namespace
}  // namespace pemaro::test
