// SPDX-License-Identifier: Apache-2.0
// The proxies of the managers: for each operation the request that it sends, the reply that it
// reads and what it logs.

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <functional>
#include <ostream>
#include <string>
#include <vector>

#include "pemaro/Status.h"
#include "tests/managers/ManagerParcels.h"
#include "tests/managers/RecordingManagers.h"
#include "tests/support/LogLines.h"
#include "tests/support/RecordingBinder.h"

namespace pemaro::test {
namespace {

using android::IBinder;
using android::Parcel;
using android::Rect;
using android::sp;
using ::testing::ElementsAre;
using ::testing::IsEmpty;

using TouchGesture = ITouchManagerClient::GestureData;
using Gesture = IGestureManagerClient::GestureData;
using HandEvent = IHandBiometricManagerClient::HandBioData;

using Call = std::function<int(const sp<IBinder>& remote)>;

// Plain pointers: one instance of this for each interface, not one for each row.
template <typename Interface>
Call on(int (*operation)(Interface& interface)) {
    return [operation](const sp<IBinder>& remote) {
        return operation(*Interface::asInterface(remote));
    };
}

Call touchCall(int (*operation)(ITouchManagerService& service)) {
    return on(operation);
}

Call gestureCall(int (*operation)(IGestureManagerService& service)) {
    return on(operation);
}

Call handCall(int (*operation)(IHandBiometricManagerService& service)) {
    return on(operation);
}

// One callback object of each kind, the same for the call and for the expected request.
const sp<ITouchManagerClient>& touchClient() {
    static const sp<ITouchManagerClient> client = new RecordingTouchManagerClient;
    return client;
}

const sp<IGestureManagerClient>& gestureClient() {
    static const sp<IGestureManagerClient> client = new RecordingGestureManagerClient;
    return client;
}

const sp<IHandBiometricManagerClient>& handClient() {
    static const sp<IHandBiometricManagerClient> client = new RecordingHandBiometricManagerClient;
    return client;
}

template <typename Client>
ParcelWriter binderOf(const sp<Client>& (*client)()) {
    return [client](Parcel& parcel) {
        parcel.writeStrongBinder(android::IInterface::asBinder(client()));
    };
}

struct ProxyRow {
    const char* name;
    const char* interface;
    uint32_t code;
    Call call;
    ParcelWriter arguments;  // what follows the token
    ParcelWriter values;     // what precedes the status in the reply
    const char* entry;
    const char* failure;  // up to the reason
};

void PrintTo(const ProxyRow& row, std::ostream* out) {
    *out << row.name;
}

const ProxyRow kProxyRows[] = {
        {"touchSubscribe", kTouch, 1, touchCall([](auto& s) { return s.subscribe(touchClient()); }),
         binderOf(touchClient), nothing, "Bp::subscribe", "subscribe() error: "},
        {"touchUnsubscribe", kTouch, 2,
         touchCall([](auto& s) { return s.unsubscribe(touchClient()); }), binderOf(touchClient),
         nothing, "Bp: unsubscribe", "unsubscribe() error: "},
        {"touchIsSupported", kTouch, 3,
         touchCall([](auto& s) { return s.isSupported(-7, gAnswer); }), numbers({-7}), numbers({1}),
         "Bp::isSupported", "isSupported() error: "},
        {"touchIsEnabled", kTouch, 4, touchCall([](auto& s) { return s.isEnabled(8, gAnswer); }),
         numbers({8}), numbers({1}), "Bp::isEnabled", "isEnabled() error: "},
        {"touchEnable", kTouch, 5, touchCall([](auto& s) { return s.enable(9); }), numbers({9}),
         nothing, "Bp::enable", "enable() error: "},
        {"touchDisable", kTouch, 6, touchCall([](auto& s) { return s.disable(10); }), numbers({10}),
         nothing, "Bp::disable", "disable() error: "},
        // Left 1, top 2, right 3, bottom 4 travel as top, left, bottom, right.
        {"touchConfigureVmRegionOn", kTouch, 7, touchCall([](auto& s) {
             Rect region(1, 2, 3, 4);
             return s.configure_vm_region(region, true);
         }),
         numbers({2, 1, 4, 3, 1}), nothing, "Bp::configure_vm_region",
         "configure_vm_region() error: "},
        {"touchConfigureVmRegionOff", kTouch, 7, touchCall([](auto& s) {
             Rect region(-1, -2, 0x7fffffff, 4);
             return s.configure_vm_region(region, false);
         }),
         numbers({-2, -1, 4, 0x7fffffff, 0}), nothing, "Bp::configure_vm_region",
         "configure_vm_region() error: "},
        {"touchGestureCallback", "TouchManagerClient", 1, on<ITouchManagerClient>([](auto& c) {
             return c.gestureCallback(makeRecords<TouchGesture>(1).data());
         }),
         [](Parcel& p) { writeRecords<TouchGesture>(p, 1); }, nothing, "Bp::gestureCallback",
         "gestureCallback() error: "},

        {"gestureSubscribe", kGesture, 1,
         gestureCall([](auto& s) { return s.subscribe(gestureClient()); }), binderOf(gestureClient),
         nothing, "Bp::subscribe", "subscribe() error: "},
        {"gestureUnsubscribe", kGesture, 2,
         gestureCall([](auto& s) { return s.unsubscribe(gestureClient()); }),
         binderOf(gestureClient), nothing, "Bp: unsubscribe", "unsubscribe() error: "},
        {"gestureEnableWakeup", kGesture, 3, gestureCall([](auto& s) { return s.enableWakeup(); }),
         nothing, nothing, "Bp::enableWakeup", "enable() error: "},
        {"gestureDisableWakeup", kGesture, 4,
         gestureCall([](auto& s) { return s.disableWakeup(); }), nothing, nothing,
         "Bp::disableWakeup", "disable() error: "},
        {"gestureStartDetection", kGesture, 5,
         gestureCall([](auto& s) { return s.startGestureDetection(); }), nothing, nothing,
         "Bp::startGestureDetection", "startGestureDetection() error: "},
        {"gestureStopDetection", kGesture, 6,
         gestureCall([](auto& s) { return s.stopGestureDetection(); }), nothing, nothing,
         "Bp::stopGestureDetection", "stopGestureDetection() error: "},
        {"gestureAddThree", kGesture, 7, gestureCall([](auto& s) {
             return s.addGesture(3, makeRecords<Gesture>(3).data(), gResult);
         }),
         [](Parcel& p) {
             p.writeInt32(3);
             writeRecords<Gesture>(p, 3);
         },
         numbers({4}), "Bp::addGesture", "addGesture() error: "},
        {"gestureAddNone", kGesture, 7, gestureCall([](auto& s) {
             return s.addGesture(0, makeRecords<Gesture>(1).data(), gResult);
         }),
         numbers({0}), numbers({4}), "Bp::addGesture", "addGesture() error: "},
        // More bytes than any request: the count travels alone.
        {"gestureAddNegative", kGesture, 7, gestureCall([](auto& s) {
             return s.addGesture(-1, makeRecords<Gesture>(1).data(), gResult);
         }),
         numbers({-1}), numbers({4}), "Bp::addGesture", "addGesture() error: "},
        {"gestureAddMostNegative", kGesture, 7, gestureCall([](auto& s) {
             return s.addGesture(INT32_MIN, makeRecords<Gesture>(1).data(), gResult);
         }),
         numbers({INT32_MIN}), numbers({4}), "Bp::addGesture", "addGesture() error: "},
        {"gestureAddTwoGibibytes", kGesture, 7, gestureCall([](auto& s) {
             return s.addGesture(29767, makeRecords<Gesture>(1).data(), gResult);
         }),
         numbers({29767}), numbers({4}), "Bp::addGesture", "addGesture() error: "},
        {"gestureAddWithoutSamples", kGesture, 7,
         gestureCall([](auto& s) { return s.addGesture(2, nullptr, gResult); }), numbers({2}),
         numbers({4}), "Bp::addGesture", "addGesture() error: "},
        {"gestureDelete", kGesture, 8, gestureCall([](auto& s) { return s.deleteGesture(-3); }),
         numbers({-3}), nothing, "Bp::deleteGesture", "deleteGesture() error: "},
        {"gestureEnable", kGesture, 9, gestureCall([](auto& s) { return s.enableGesture(4); }),
         numbers({4}), nothing, "Bp::enableGesture", "enableGesture() error: "},
        {"gestureDisable", kGesture, 10, gestureCall([](auto& s) { return s.disableGesture(5); }),
         numbers({5}), nothing, "Bp::disableGesture", "disableGesture() error: "},
        {"gestureVerify", kGesture, 11, gestureCall([](auto& s) {
             return s.improveGestureTraining(makeRecords<Gesture>(1).data(), gResult);
         }),
         [](Parcel& p) { writeRecords<Gesture>(p, 1); }, numbers({2}), "Bp::improveGestureTraining",
         "improveGestureTraining() error: "},
        {"gestureVerifyWithoutSample", kGesture, 11,
         gestureCall([](auto& s) { return s.improveGestureTraining(nullptr, gResult); }), nothing,
         numbers({2}), "Bp::improveGestureTraining", "improveGestureTraining() error: "},
        {"gestureMaxPreDefined", kGesture, 12,
         gestureCall([](auto& s) { return s.getMaxPreDefinedGesture(gCount); }), nothing,
         numbers({8}), "Bp::getMaxPreDefinedGesture enter", "getMaxPreDefinedGesture error: "},
        {"gestureMaxUserDefined", kGesture, 13,
         gestureCall([](auto& s) { return s.getMaxUserDefinedGesture(gCount); }), nothing,
         numbers({8}), "Bp::getMaxUserDefinedGesture enter", "getMaxUserDefinedGesture error: "},
        {"gestureGestureCallback", "GestureManagerClient", 1,
         on<IGestureManagerClient>(
                 [](auto& c) { return c.gestureCallback(makeRecords<Gesture>(1).data()); }),
         [](Parcel& p) { writeRecords<Gesture>(p, 1); }, nothing, "Bp::gestureCallback",
         "gestureCallback() error: "},
        {"gestureGestureCallbackWithoutRecord", "GestureManagerClient", 1,
         on<IGestureManagerClient>([](auto& c) { return c.gestureCallback(nullptr); }), nothing,
         nothing, "Bp::gestureCallback", "gestureCallback() error: "},

        {"handSubscribe", kHand, 1, handCall([](auto& s) { return s.subscribe(handClient()); }),
         binderOf(handClient), nothing, "Bp::subscribe", "subscribe() error: "},
        {"handUnsubscribe", kHand, 2, handCall([](auto& s) { return s.unsubscribe(handClient()); }),
         binderOf(handClient), nothing, "Bp: unsubscribe", "unsubscribe() error: "},
        {"handStartEnrollment", kHand, 3, handCall([](auto& s) { return s.startEnrollment(); }),
         nothing, nothing, "Bp::startEnrollment", "startEnrollment error: "},
        {"handStopEnrollment", kHand, 4, handCall([](auto& s) { return s.stopEnrollment(); }),
         nothing, nothing, "Bp::stopEnrollment", "stopEnrollment error: "},
        {"handScan", kHand, 5, handCall([](auto& s) { return s.scan(); }), nothing, nothing,
         "Bp::scan", "scan error: "},
        {"handStartMatching", kHand, 6, handCall([](auto& s) { return s.startMatching(); }),
         nothing, nothing, "Bp::startMatching", "startMatching error: "},
        {"handStopMatching", kHand, 7, handCall([](auto& s) { return s.stopMatching(); }), nothing,
         nothing, "Bp::stopMatching", "stopMatching error: "},
        {"handCancelScan", kHand, 8, handCall([](auto& s) { return s.cancelScan(); }), nothing,
         nothing, "Bp::cancelScan", "cancelScan error: "},
        {"handSetSecurity", kHand, 9, handCall([](auto& s) { return s.setSecurity(-2); }),
         numbers({-2}), nothing, "Bp::setSecurity", "setSecurity error: "},
        {"handSetProfileName", kHand, 10,
         handCall([](auto& s) { return s.setProfileName("alice"); }), names({"alice"}), nothing,
         "Bp::setProfileName", "setProfileName error: "},
        {"handDeleteProfile", kHand, 11, handCall([](auto& s) { return s.deleteProfile(""); }),
         names({""}), nothing, "Bp::deleteProfile", "deleteProfile error: "},
        {"handRenameProfile", kHand, 12,
         handCall([](auto& s) { return s.renameProfile("A", "B"); }), names({"A", "B"}), nothing,
         "Bp::renameProfile", "renameProfile error: "},
        {"handGetMaxUser", kHand, 13, handCall([](auto& s) { return s.getMaxUser(gCount); }),
         nothing, numbers({5}), "Bp::getMaxUser enter", "getMaxUser error: "},
        {"handGetProfileListOfNone", kHand, 14,
         handCall([](auto& s) { return s.getProfileList(gNames); }), nothing, numbers({0}),
         "Bp::getProfileList enter", "getProfileList error: "},
        {"handEnableWakeup", kHand, 15, handCall([](auto& s) { return s.enableWakeup(); }), nothing,
         nothing, "Bp::enableWakeup", "enable() error: "},
        {"handDisableWakeup", kHand, 16, handCall([](auto& s) { return s.disableWakeup(); }),
         nothing, nothing, "Bp::disableWakeup", "disable() error: "},
        {"handCallback", "HandBiometricManagerClient", 1,
         on<IHandBiometricManagerClient>(
                 [](auto& c) { return c.handBiometricCallback(makeRecords<HandEvent>(1).data()); }),
         [](Parcel& p) { writeRecords<HandEvent>(p, 1); }, nothing, "Bp::handBiometricCallback",
         "handBiometricCallback() error: "},
};

class ManagerProxy : public ::testing::Test {
  protected:
    void SetUp() override { clearLog(); }

    const sp<RecordingBinder> mRemote = new RecordingBinder;
};

class ManagerProxyRow : public ManagerProxy, public ::testing::WithParamInterface<ProxyRow> {
  protected:
    std::string tag() const { return std::string("I") + GetParam().interface; }
    std::string descriptor() const { return std::string("pemaro.") + GetParam().interface; }
    std::string entry() const { return std::string("D ") + GetParam().entry; }
};

INSTANTIATE_TEST_SUITE_P(EveryOperation, ManagerProxyRow, ::testing::ValuesIn(kProxyRows),
                         [](const auto& info) { return info.param.name; });

TEST_P(ManagerProxyRow, SendsItsRequestAndPassesTheStatusOnUnlogged) {
    for (int status : {0, STATUS_NOT_FOUND, -32}) {
        clearLog();
        mRemote->clearTransactions();
        mRemote->answer([&](Parcel& reply) {
            GetParam().values(reply);
            reply.writeInt32(status);
        });
        EXPECT_EQ(status, GetParam().call(mRemote));
        ASSERT_EQ(1u, mRemote->transactions().size());
        const RecordingBinder::Transaction sent = mRemote->lastTransaction();
        EXPECT_EQ(GetParam().code, sent.code);
        EXPECT_EQ(0u, sent.flags);
        EXPECT_TRUE(requestBytes(descriptor(), GetParam().arguments) == sent.request);
        EXPECT_EQ((Lines{entry()}), linesOf(tag()));
    }
}

TEST_P(ManagerProxyRow, MakesOneStatusOfEveryTransportFailure) {
    struct {
        android::status_t status;
        const char* text;
    } failures[] = {{android::DEAD_OBJECT, "Broken pipe"},
                    {android::PERMISSION_DENIED, "Operation not permitted"},
                    {android::UNKNOWN_TRANSACTION, "Bad message"}};
    for (const auto& failure : failures) {
        clearLog();
        mRemote->fail(failure.status);
        EXPECT_EQ(STATUS_UNKNOWN_ERROR, GetParam().call(mRemote));
        EXPECT_EQ((Lines{entry(), std::string("E ") + GetParam().failure + failure.text}),
                  linesOf(tag()));
    }
}

// ---- results ----

TEST_F(ManagerProxy, TakesAnyNumberButZeroAsYes) {
    bool answer = false;
    const sp<ITouchManagerService> service = ITouchManagerService::asInterface(mRemote);
    mRemote->answer(numbers({5, 0}));
    EXPECT_EQ(0, service->isSupported(1, answer));
    EXPECT_TRUE(answer);
    mRemote->answer(numbers({0, STATUS_INVALID_COMMAND}));
    EXPECT_EQ(STATUS_INVALID_COMMAND, service->isSupported(1, answer));
    EXPECT_FALSE(answer);
    mRemote->answer(numbers({-1, 0}));
    EXPECT_EQ(0, service->isEnabled(1, answer));
    EXPECT_TRUE(answer);
    mRemote->answer(numbers({0, 0}));
    EXPECT_EQ(0, service->isEnabled(1, answer));
    EXPECT_FALSE(answer);
}

TEST_F(ManagerProxy, StoresTheValueWhateverTheStatus) {
    const sp<IGestureManagerService> gestures = IGestureManagerService::asInterface(mRemote);
    const sp<IHandBiometricManagerService> hands =
            IHandBiometricManagerService::asInterface(mRemote);
    Gesture sample = {};
    int result = 0;
    unsigned int count = 0;

    mRemote->answer(numbers({2, STATUS_NOT_FOUND}));
    EXPECT_EQ(STATUS_NOT_FOUND, gestures->improveGestureTraining(&sample, result));
    EXPECT_EQ(2, result);
    mRemote->answer(numbers({-9, 0}));
    EXPECT_EQ(0, gestures->addGesture(1, &sample, result));
    EXPECT_EQ(-9, result);
    mRemote->answer(numbers({8, 0}));
    EXPECT_EQ(0, gestures->getMaxUserDefinedGesture(count));
    EXPECT_EQ(8u, count);
    mRemote->answer(numbers({-1, STATUS_TIMEOUT}));
    EXPECT_EQ(STATUS_TIMEOUT, gestures->getMaxPreDefinedGesture(count));
    EXPECT_EQ(0xffffffffu, count);
    mRemote->answer(numbers({5, 0}));
    EXPECT_EQ(0, hands->getMaxUser(count));
    EXPECT_EQ(5u, count);
}

TEST_F(ManagerProxy, StoresNothingWhenTheTransactionFails) {
    const sp<ITouchManagerService> touches = ITouchManagerService::asInterface(mRemote);
    const sp<IGestureManagerService> gestures = IGestureManagerService::asInterface(mRemote);
    const sp<IHandBiometricManagerService> hands =
            IHandBiometricManagerService::asInterface(mRemote);
    // A reply that is there is not read either.
    mRemote->answer(numbers({1, 1, 1}), android::FAILED_TRANSACTION);
    bool yes = true;
    bool no = false;
    int result = 77;
    unsigned int count = 78;
    std::vector<std::string> list = {"kept"};
    Gesture sample = {};

    EXPECT_EQ(STATUS_UNKNOWN_ERROR, touches->isSupported(1, yes));
    EXPECT_EQ(STATUS_UNKNOWN_ERROR, touches->isEnabled(1, no));
    EXPECT_EQ(STATUS_UNKNOWN_ERROR, gestures->addGesture(1, &sample, result));
    EXPECT_EQ(STATUS_UNKNOWN_ERROR, gestures->improveGestureTraining(&sample, result));
    EXPECT_EQ(STATUS_UNKNOWN_ERROR, gestures->getMaxPreDefinedGesture(count));
    EXPECT_EQ(STATUS_UNKNOWN_ERROR, gestures->getMaxUserDefinedGesture(count));
    EXPECT_EQ(STATUS_UNKNOWN_ERROR, hands->getMaxUser(count));
    EXPECT_EQ(STATUS_UNKNOWN_ERROR, hands->getProfileList(list));
    EXPECT_TRUE(yes);
    EXPECT_FALSE(no);
    EXPECT_EQ(77, result);
    EXPECT_EQ(78u, count);
    EXPECT_THAT(list, ElementsAre("kept"));
}

TEST_F(ManagerProxy, SendsThreeSamplesAsOneBlock) {
    mRemote->answer(numbers({0, 0}));
    int result = 0;
    IGestureManagerService::asInterface(mRemote)->addGesture(3, makeRecords<Gesture>(3).data(),
                                                             result);
    const size_t token = requestBytes("pemaro.GestureManagerService").size();
    EXPECT_EQ(token + 4 + 216432, mRemote->lastTransaction().request.size());
}

// ---- names ----

TEST_F(ManagerProxy, CannotSendANullName) {
    const sp<IHandBiometricManagerService> service =
            IHandBiometricManagerService::asInterface(mRemote);
    EXPECT_EQ(STATUS_NULL_POINTER, service->setProfileName(nullptr));
    EXPECT_EQ(STATUS_NULL_POINTER, service->deleteProfile(nullptr));
    EXPECT_EQ(STATUS_NULL_POINTER, service->renameProfile(nullptr, "B"));
    EXPECT_EQ(STATUS_NULL_POINTER, service->renameProfile("A", nullptr));
    EXPECT_THAT(mRemote->transactions(), IsEmpty());
}

class ProfileListProxy : public ManagerProxy {
  protected:
    /// Answers with `count`, the names and, unless it is left out, the status.
    int get(int32_t count, std::vector<const char*> sent, const ParcelWriter& status) {
        mRemote->answer([&](Parcel& reply) {
            reply.writeInt32(count);
            names(sent)(reply);
            status(reply);
        });
        return IHandBiometricManagerService::asInterface(mRemote)->getProfileList(mNames);
    }

    std::vector<std::string> mNames = {"held"};
};

TEST_F(ProfileListProxy, AppendsTheNames) {
    EXPECT_EQ(0, get(2, {"alice", "bob"}, numbers({0})));
    EXPECT_THAT(mNames, ElementsAre("held", "alice", "bob"));
    EXPECT_EQ((Lines{"D Bp::getProfileList enter", "D Bp::getProfileList pName is alice",
                     "D Bp::getProfileList pName is bob"}),
              linesOf("IHandBiometricManagerService"));
}

TEST_F(ProfileListProxy, AppendsTheNamesWhateverTheStatus) {
    EXPECT_EQ(STATUS_TIMEOUT, get(1, {""}, numbers({STATUS_TIMEOUT})));
    EXPECT_THAT(mNames, ElementsAre("held", ""));
}

TEST_F(ProfileListProxy, AppendsNothingForNoneOrANegativeNumber) {
    EXPECT_EQ(STATUS_TIMEOUT, get(0, {}, numbers({STATUS_TIMEOUT})));
    EXPECT_EQ(STATUS_TIMEOUT, get(-1, {}, numbers({STATUS_TIMEOUT})));
    EXPECT_EQ(STATUS_TIMEOUT, get(INT32_MIN, {}, numbers({STATUS_TIMEOUT})));
    EXPECT_THAT(mNames, ElementsAre("held"));
}

// The driver delivers a stub's positive result as a reply without anything.
TEST_F(ProfileListProxy, TakesAnEmptyReplyForNoNamesAndSuccess) {
    EXPECT_EQ(0, get(0, {}, nothing));
    mRemote->answer([](Parcel&) {});
    EXPECT_EQ(0, IHandBiometricManagerService::asInterface(mRemote)->getProfileList(mNames));
    EXPECT_THAT(mNames, ElementsAre("held"));
}

TEST_F(ProfileListProxy, StopsWhereTheReplyEnds) {
    EXPECT_EQ(STATUS_CORRUPT_DATA, get(2, {"alice"}, nothing));
    EXPECT_THAT(mNames, ElementsAre("held", "alice"));
}

TEST_F(ProfileListProxy, StopsAtANameThatDoesNotEnd) {
    EXPECT_EQ(STATUS_CORRUPT_DATA, get(2, {"alice"}, numbers({0x41414141})));
    EXPECT_THAT(mNames, ElementsAre("held", "alice"));
}

TEST_F(ProfileListProxy, DoesNotBelieveALongList) {
    EXPECT_EQ(STATUS_CORRUPT_DATA, get(INT32_MAX, {"alice", "barbara"}, nothing));
    EXPECT_THAT(mNames, ElementsAre("held", "alice", "barbara"));
    EXPECT_GE(16u, mNames.capacity());
}

// Four bytes at the end are the status, whatever they would spell.
TEST_F(ProfileListProxy, TakesNoStatusForAName) {
    for (int32_t status : {0, STATUS_NOT_FOUND, 0x00626f62 /* bob */}) {
        mNames = {"held"};
        clearLog();
        EXPECT_EQ(STATUS_CORRUPT_DATA, get(2, {"alice"}, numbers({status}))) << status;
        EXPECT_THAT(mNames, ElementsAre("held", "alice"));
        EXPECT_EQ((Lines{"D Bp::getProfileList enter", "D Bp::getProfileList pName is alice"}),
                  linesOf("IHandBiometricManagerService"));
    }
}

TEST_F(ProfileListProxy, MissesAStatusThatIsNotThere) {
    EXPECT_EQ(STATUS_CORRUPT_DATA, get(2, {"alice", "barbara"}, nothing));
    EXPECT_THAT(mNames, ElementsAre("held", "alice", "barbara"));
}

// A parcel that grows takes half as much again, and copies what it had each time.
TEST(CallbackProxy, SizesTheRequestForItsRecordBeforehand) {
    const sp<RecordingBinder> remote = new RecordingBinder;
    size_t size = 0;
    size_t capacity = 0;
    remote->handle([&](uint32_t, const Parcel& data, Parcel* reply) {
        size = data.dataSize();
        capacity = data.dataCapacity();
        return reply->writeInt32(STATUS_NO_ERROR);
    });
    EXPECT_EQ(STATUS_NO_ERROR, ITouchManagerClient::asInterface(remote)->gestureCallback(
                                       makeRecords<TouchGesture>(1).data()));
    EXPECT_GT(size, sizeof(TouchGesture));
    EXPECT_GE(capacity, size);
    EXPECT_LT(capacity, size + 64);
}

}  // namespace
}  // namespace pemaro::test
