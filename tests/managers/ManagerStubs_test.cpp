// SPDX-License-Identifier: Apache-2.0
// The stubs of the managers: for each transaction the call that it makes, the reply that it writes
// and what it logs, and what it makes of requests that are not whole.

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <ostream>
#include <string>
#include <vector>

#include "pemaro/Status.h"
#include "tests/managers/ManagerParcels.h"
#include "tests/managers/RecordingManagers.h"
#include "tests/support/LogLines.h"

namespace pemaro::test {
namespace {

using android::IBinder;
using android::Parcel;
using android::sp;
using android::status_t;
using ::testing::ElementsAre;
using ::testing::ElementsAreArray;

using TouchGesture = ITouchManagerClient::GestureData;
using Gesture = IGestureManagerClient::GestureData;
using HandEvent = IHandBiometricManagerClient::HandBioData;

constexpr char kTouchCallback[] = "TouchManagerClient";
constexpr char kGestureCallback[] = "GestureManagerClient";
constexpr char kHandCallback[] = "HandBiometricManagerClient";

void noBinder(Parcel& parcel) {
    parcel.writeStrongBinder(nullptr);
}

/// A stub and what reaches the implementation behind it.
struct Stub {
    sp<IBinder> binder;
    Recording& recording;
};

template <typename Implementation>
Stub makeStub() {
    const sp<Implementation> implementation = new Implementation;
    return {implementation, *implementation};
}

Stub makeStubOf(const std::string& interface) {
    const struct {
        const char* interface;
        Stub (*make)();
    } stubs[] = {{kTouch, makeStub<RecordingTouchManagerService>},
                 {kTouchCallback, makeStub<RecordingTouchManagerClient>},
                 {kGesture, makeStub<RecordingGestureManagerService>},
                 {kGestureCallback, makeStub<RecordingGestureManagerClient>},
                 {kHand, makeStub<RecordingHandBiometricManagerService>},
                 {kHandCallback, makeStub<RecordingHandBiometricManagerClient>}};
    size_t i = 0;
    while (stubs[i].interface != interface) {
        ++i;
    }
    return stubs[i].make();
}

/// The call that reaches the implementation, as a Recording tells it, and what that leaves as its
/// answer if it has one.
struct ExpectedCall {
    ExpectedCall(const char* text, int64_t number = 0) : text(text), number(number) {}
    ExpectedCall(const char* text, std::vector<std::string> names) : text(text), names(names) {}

    const char* text;
    int64_t number = 0;
    std::vector<std::string> names;
};

struct StubRow {
    const char* name;
    const char* interface;
    uint32_t code;
    ParcelWriter arguments;  // what follows the token
    ExpectedCall call;
    ParcelWriter values;  // what precedes the status in the reply
    std::vector<const char*> log;
};

void PrintTo(const StubRow& row, std::ostream* out) {
    *out << row.name;
}

const StubRow kStubRows[] = {
        {"touchSubscribe",
         kTouch,
         1,
         noBinder,
         "subscribe(null)",
         nothing,
         {"D SUBSCRIBE transact received..."}},
        {"touchUnsubscribe",
         kTouch,
         2,
         noBinder,
         "unsubscribe(null)",
         nothing,
         {"D UNSUBSCRIBE transact received..."}},
        {"touchIsSupported",
         kTouch,
         3,
         numbers({-7}),
         {"isSupported(-7)", true},
         numbers({1}),
         {"D IS_SUPPORTED transact received..."}},
        {"touchIsNotSupported",
         kTouch,
         3,
         numbers({7}),
         {"isSupported(7)", false},
         numbers({0}),
         {"D IS_SUPPORTED transact received..."}},
        {"touchIsEnabled",
         kTouch,
         4,
         numbers({8}),
         {"isEnabled(8)", true},
         numbers({1}),
         {"D IS_ENABLED transact received..."}},
        {"touchIsNotEnabled",
         kTouch,
         4,
         numbers({8}),
         {"isEnabled(8)", false},
         numbers({0}),
         {"D IS_ENABLED transact received..."}},
        {"touchEnable",
         kTouch,
         5,
         numbers({9}),
         "enable(9)",
         nothing,
         {"D ENABLE transact received..."}},
        {"touchDisable",
         kTouch,
         6,
         numbers({10}),
         "disable(10)",
         nothing,
         {"D DISABLE transact received..."}},
        // Top, left, bottom, right.
        {"touchConfigureVmRegionOn",
         kTouch,
         7,
         numbers({2, 1, 4, 3, 1}),
         "configure_vm_region(1, 2, 3, 4, true)",
         nothing,
         {"D CONFIGURE_VM_REGION transact received..."}},
        {"touchConfigureVmRegionOff",
         kTouch,
         7,
         numbers({-2, -1, -4, -3, 0}),
         "configure_vm_region(-1, -2, -3, -4, false)",
         nothing,
         {"D CONFIGURE_VM_REGION transact received..."}},
        {"touchConfigureVmRegionWithAnyFlag",
         kTouch,
         7,
         numbers({2, 1, 4, 3, 7}),
         "configure_vm_region(1, 2, 3, 4, true)",
         nothing,
         {"D CONFIGURE_VM_REGION transact received..."}},
        {"touchGestureCallback",
         kTouchCallback,
         1,
         [](Parcel& p) { writeRecords<TouchGesture>(p, 1); },
         "gestureCallback(1 record)",
         nothing,
         {"D INJECT_GESTURE transact received..."}},

        {"gestureSubscribe",
         kGesture,
         1,
         noBinder,
         "subscribe(null)",
         nothing,
         {"D SUBSCRIBE transact received..."}},
        {"gestureUnsubscribe",
         kGesture,
         2,
         noBinder,
         "unsubscribe(null)",
         nothing,
         {"D UNSUBSCRIBE transact received..."}},
        {"gestureEnableWakeup",
         kGesture,
         3,
         nothing,
         "enableWakeup()",
         nothing,
         {"D ENABLE_WAKEUP transact received..."}},
        {"gestureDisableWakeup",
         kGesture,
         4,
         nothing,
         "disableWakeup()",
         nothing,
         {"D DISABLE_WAKEUP transact received..."}},
        {"gestureStartDetection",
         kGesture,
         5,
         nothing,
         "startGestureDetection()",
         nothing,
         {"D ENABLE transact received..."}},
        {"gestureStopDetection",
         kGesture,
         6,
         nothing,
         "stopGestureDetection()",
         nothing,
         {"D DISABLE transact received..."}},
        {"gestureAddThree",
         kGesture,
         7,
         [](Parcel& p) {
             p.writeInt32(3);
             writeRecords<Gesture>(p, 3);
         },
         {"addGesture(3, 3 records)", -4},
         numbers({-4}),
         {"D ADD_GESTURE transact received..."}},
        {"gestureAddNone",
         kGesture,
         7,
         numbers({0}),
         {"addGesture(0, 0 records)", 4},
         numbers({4}),
         {"D ADD_GESTURE transact received..."}},
        {"gestureAddNegative",
         kGesture,
         7,
         [](Parcel& p) {
             p.writeInt32(-1);
             writeRecords<Gesture>(p, 1);
         },
         {"addGesture(-1, null)", 4},
         numbers({4}),
         {"D ADD_GESTURE transact received..."}},
        {"gestureAddMostNegative",
         kGesture,
         7,
         numbers({INT32_MIN}),
         {"addGesture(-2147483648, null)", 4},
         numbers({4}),
         {"D ADD_GESTURE transact received..."}},
        {"gestureAddMoreThanThereIs",
         kGesture,
         7,
         [](Parcel& p) {
             p.writeInt32(4);
             writeRecords<Gesture>(p, 3);
         },
         {"addGesture(4, null)", 4},
         numbers({4}),
         {"D ADD_GESTURE transact received..."}},
        {"gestureAddMoreThanAnyRequestHolds",
         kGesture,
         7,
         [](Parcel& p) {
             p.writeInt32(INT32_MAX);
             writeRecords<Gesture>(p, 1);
         },
         {"addGesture(2147483647, null)", 4},
         numbers({4}),
         {"D ADD_GESTURE transact received..."}},
        {"gestureDelete",
         kGesture,
         8,
         numbers({-3}),
         "deleteGesture(-3)",
         nothing,
         {"D DELETE_GESTURE transact received..."}},
        {"gestureEnable",
         kGesture,
         9,
         numbers({4}),
         "enableGesture(4)",
         nothing,
         {"D ENABLE_GESTURE transact received..."}},
        {"gestureDisable",
         kGesture,
         10,
         numbers({5}),
         "disableGesture(5)",
         nothing,
         {"D DISABLE_GESTURE transact received..."}},
        {"gestureVerify",
         kGesture,
         11,
         [](Parcel& p) { writeRecords<Gesture>(p, 1); },
         {"improveGestureTraining(1 record)", 2},
         numbers({2}),
         {"D VERIFY_GESTURE transact received..."}},
        {"gestureVerifyNothing",
         kGesture,
         11,
         nothing,
         {"improveGestureTraining(null)", 2},
         numbers({2}),
         {"D VERIFY_GESTURE transact received..."}},
        {"gestureMaxPreDefined",
         kGesture,
         12,
         nothing,
         {"getMaxPreDefinedGesture()", 0xffffffff},
         numbers({-1}),
         {"D GET_MAX_PREDEFINED_GESTURE transact received...",
          "D GET_MAX_PREDEFINED_GESTURE transact finished..."}},
        {"gestureMaxUserDefined",
         kGesture,
         13,
         nothing,
         {"getMaxUserDefinedGesture()", 8},
         numbers({8}),
         {"D GET_MAX_USERDEFINED_GESTURE transact received...",
          "D GET_MAX_USERDEFINED_GESTURE transact finished..."}},
        {"gestureGestureCallback",
         kGestureCallback,
         1,
         [](Parcel& p) { writeRecords<Gesture>(p, 1); },
         "gestureCallback(1 record)",
         nothing,
         {"D INJECT_GESTURE transact received..."}},

        {"handSubscribe",
         kHand,
         1,
         noBinder,
         "subscribe(null)",
         nothing,
         {"D SUBSCRIBE transact received..."}},
        {"handUnsubscribe",
         kHand,
         2,
         noBinder,
         "unsubscribe(null)",
         nothing,
         {"D UNSUBSCRIBE transact received..."}},
        {"handStartEnrollment",
         kHand,
         3,
         nothing,
         "startEnrollment()",
         nothing,
         {"D START_ENROLLMENT transact received..."}},
        {"handStopEnrollment",
         kHand,
         4,
         nothing,
         "stopEnrollment()",
         nothing,
         {"D STOP_ENROLLMENT transact received..."}},
        {"handScan", kHand, 5, nothing, "scan()", nothing, {"D SCAN transact received..."}},
        {"handStartMatching",
         kHand,
         6,
         nothing,
         "startMatching()",
         nothing,
         {"D START_MATCHING transact received..."}},
        {"handStopMatching",
         kHand,
         7,
         nothing,
         "stopMatching()",
         nothing,
         {"D STOP_MATCHING transact received..."}},
        {"handCancelScan",
         kHand,
         8,
         nothing,
         "cancelScan()",
         nothing,
         {"D CANCEL_SCAN transact received..."}},
        {"handSetSecurity",
         kHand,
         9,
         numbers({-2}),
         "setSecurity(-2)",
         nothing,
         {"D SET_SECURITY transact received..."}},
        {"handSetProfileName",
         kHand,
         10,
         names({"alice"}),
         "setProfileName('alice')",
         nothing,
         {"D SET_PROFILENAME transact received..."}},
        {"handSetNoProfileName",
         kHand,
         10,
         nothing,
         "setProfileName(null)",
         nothing,
         {"D SET_PROFILENAME transact received..."}},
        {"handSetProfileNameThatDoesNotEnd",
         kHand,
         10,
         numbers({0x41414141}),
         "setProfileName(null)",
         nothing,
         {"D SET_PROFILENAME transact received..."}},
        {"handDeleteProfile",
         kHand,
         11,
         names({""}),
         "deleteProfile('')",
         nothing,
         {"D DELETE_PROFILE transact received..."}},
        {"handDeleteNoProfile",
         kHand,
         11,
         nothing,
         "deleteProfile(null)",
         nothing,
         {"D DELETE_PROFILE transact received..."}},
        {"handRenameProfile",
         kHand,
         12,
         names({"A", "B"}),
         "renameProfile('A', 'B')",
         nothing,
         {"D RENAME_PROFILE transact received..."}},
        {"handRenameProfileToNothing",
         kHand,
         12,
         names({"A"}),
         "renameProfile('A', null)",
         nothing,
         {"D RENAME_PROFILE transact received..."}},
        {"handGetMaxUser",
         kHand,
         13,
         nothing,
         {"getMaxUser()", 5},
         numbers({5}),
         {"D GET_MAXUSER transact received...", "D GET_MAXUSER transact finished..."}},
        {"handGetProfileListOfNone",
         kHand,
         14,
         nothing,
         "getProfileList()",
         numbers({0}),
         {"D GET_PROFILELIST transact received...", "D GET_PROFILELIST transact finished..."}},
        {"handGetProfileListOfTwo",
         kHand,
         14,
         nothing,
         {"getProfileList()", {"alice", "bob"}},
         [](Parcel& p) {
             p.writeInt32(2);
             names({"alice", "bob"})(p);
         },
         {"D GET_PROFILELIST transact received...", "D Bp::GET_PROFILELIST transact write string 0",
          "D Bp::GET_PROFILELIST transact write string 1",
          "D GET_PROFILELIST transact finished..."}},
        {"handEnableWakeup",
         kHand,
         15,
         nothing,
         "enableWakeup()",
         nothing,
         {"D ENABLE_WAKEUP transact received..."}},
        {"handDisableWakeup",
         kHand,
         16,
         nothing,
         "disableWakeup()",
         nothing,
         {"D DISABLE_WAKEUP transact received..."}},
        {"handCallback",
         kHandCallback,
         1,
         [](Parcel& p) { writeRecords<HandEvent>(p, 1); },
         "handBiometricCallback(1 record)",
         nothing,
         {"D INJECT_HANDBIOMETRIC transact received..."}},
};

class ManagerStubRow : public ::testing::TestWithParam<StubRow> {
  protected:
    void fill(Parcel& data) const {
        writeToken(data, std::string("pemaro.") + GetParam().interface);
        GetParam().arguments(data);
    }

    /// A stub whose implementation answers as the row has it.
    Stub stub(int status) const {
        const Stub stub = makeStubOf(GetParam().interface);
        stub.recording.status = status;
        stub.recording.number = GetParam().call.number;
        stub.recording.names = GetParam().call.names;
        return stub;
    }
};

INSTANTIATE_TEST_SUITE_P(EveryTransaction, ManagerStubRow, ::testing::ValuesIn(kStubRows),
                         [](const auto& info) { return info.param.name; });

TEST_P(ManagerStubRow, CallsTheOperationAndRepliesWithValuesThenStatus) {
    for (int status : {0, STATUS_INVALID_STATE, -1}) {
        Parcel data;
        Parcel reply;
        fill(data);
        clearLog();
        const Stub called = stub(status);
        EXPECT_EQ(android::NO_ERROR, called.binder->transact(GetParam().code, data, &reply));
        EXPECT_EQ(Recording::Calls{GetParam().call.text}, called.recording.calls);
        EXPECT_EQ(1, called.binder->getStrongCount());
        EXPECT_EQ(parcelBytes([&](Parcel& expected) {
                      GetParam().values(expected);
                      expected.writeInt32(status);
                  }),
                  bytesOf(reply));
        EXPECT_THAT(linesOf(std::string("I") + GetParam().interface),
                    ElementsAreArray(GetParam().log));
    }
}

TEST_P(ManagerStubRow, AnswersACallerThatWantsNoReply) {
    Parcel data;
    fill(data);
    const Stub called = stub(0);
    EXPECT_EQ(android::NO_ERROR, called.binder->transact(GetParam().code, data, nullptr));
    EXPECT_EQ(Recording::Calls{GetParam().call.text}, called.recording.calls);
}

// ---- the token and the range of codes ----

struct CodeRange {
    const char* interface;
    uint32_t last;
};

void PrintTo(const CodeRange& range, std::ostream* out) {
    *out << range.interface;
}

class ManagerStub : public ::testing::TestWithParam<CodeRange> {
  protected:
    // No test of these lets a call reach the implementation.
    void TearDown() override { EXPECT_EQ(Recording::Calls{}, mStub.recording.calls); }

    const Stub mStub = makeStubOf(GetParam().interface);
    Parcel mReply;
};

INSTANTIATE_TEST_SUITE_P(EveryInterface, ManagerStub,
                         ::testing::Values(CodeRange{kTouch, 7}, CodeRange{kTouchCallback, 1},
                                           CodeRange{kGesture, 13}, CodeRange{kGestureCallback, 1},
                                           CodeRange{kHand, 16}, CodeRange{kHandCallback, 1}),
                         [](const auto& info) { return info.param.interface; });

TEST_P(ManagerStub, RefusesEveryRequestWithoutTheToken) {
    std::vector<uint32_t> codes = {0, GetParam().last + 1, IBinder::LAST_CALL_TRANSACTION,
                                   IBinder::INTERFACE_TRANSACTION, IBinder::DUMP_TRANSACTION};
    for (uint32_t code = 1; code <= GetParam().last; ++code) {
        codes.push_back(code);
    }
    for (uint32_t code : codes) {
        Parcel empty;
        EXPECT_EQ(-1, mStub.binder->transact(code, empty, &mReply)) << code;
        Parcel foreign;
        writeToken(foreign, "pemaro.TouchService");
        EXPECT_EQ(-1, mStub.binder->transact(code, foreign, &mReply)) << code;
    }
    EXPECT_EQ(Bytes{}, bytesOf(mReply));
}

TEST_P(ManagerStub, LeavesOtherCodesToThePlatform) {
    const android::String16 descriptor = mStub.binder->getInterfaceDescriptor();
    for (uint32_t code : {0u, GetParam().last + 1, uint32_t{IBinder::LAST_CALL_TRANSACTION}}) {
        Parcel data;
        data.writeInterfaceToken(descriptor);
        EXPECT_EQ(android::UNKNOWN_TRANSACTION, mStub.binder->transact(code, data, &mReply))
                << code;
        EXPECT_EQ(Bytes{}, bytesOf(mReply));
    }
    Parcel query;
    query.writeInterfaceToken(descriptor);
    EXPECT_EQ(android::NO_ERROR,
              mStub.binder->transact(IBinder::INTERFACE_TRANSACTION, query, &mReply));
    EXPECT_EQ(parcelBytes([&](Parcel& p) { p.writeString16(descriptor); }), bytesOf(mReply));
}

// ---- callback objects ----

template <typename Service, typename Client>
void expectObjectHandedOn(const char* descriptor) {
    const sp<Client> client = new Client;
    const sp<Service> service = new Service;
    for (uint32_t code : {kSubscribe, kUnsubscribe}) {
        Parcel data;
        Parcel reply;
        writeToken(data, descriptor);
        data.writeStrongBinder(client);
        EXPECT_EQ(android::NO_ERROR, service->transact(code, data, &reply));
    }
    EXPECT_EQ((Recording::Calls{"subscribe(object)", "unsubscribe(object)"}), service->calls);
    EXPECT_THAT(service->clients, ElementsAre(client, client));
}

TEST(ManagerSubscriptionStub, HandsTheCallbackObjectOn) {
    expectObjectHandedOn<RecordingTouchManagerService, RecordingTouchManagerClient>(
            "pemaro.TouchManagerService");
    expectObjectHandedOn<RecordingGestureManagerService, RecordingGestureManagerClient>(
            "pemaro.GestureManagerService");
    expectObjectHandedOn<RecordingHandBiometricManagerService, RecordingHandBiometricManagerClient>(
            "pemaro.HandBiometricManagerService");
}

// ---- records in place ----

struct CallbackRow {
    const char* interface;
    std::string operation;
    void (*writeRecord)(Parcel& parcel);
    size_t size;
};

void PrintTo(const CallbackRow& row, std::ostream* out) {
    *out << row.interface;
}

template <typename Record>
void writeRecord(Parcel& parcel) {
    writeRecords<Record>(parcel, 1);
}

const CallbackRow kCallbackRows[] = {
        {kTouchCallback, "gestureCallback", writeRecord<TouchGesture>, sizeof(TouchGesture)},
        {kGestureCallback, "gestureCallback", writeRecord<Gesture>, sizeof(Gesture)},
        {kHandCallback, "handBiometricCallback", writeRecord<HandEvent>, sizeof(HandEvent)},
};

class ManagerCallbackStub : public ::testing::TestWithParam<CallbackRow> {
  protected:
    /// A request with one record, cut to all but its last `missing` bytes.
    void fill(size_t missing) {
        mData.writeInterfaceToken(mStub.binder->getInterfaceDescriptor());
        GetParam().writeRecord(mData);
        mData.setDataSize(mData.dataSize() - missing);
    }

    status_t inject() { return mStub.binder->transact(1, mData, &mReply); }

    const Stub mStub = makeStubOf(GetParam().interface);
    Parcel mData;
    Parcel mReply;
};

INSTANTIATE_TEST_SUITE_P(EveryCallback, ManagerCallbackStub, ::testing::ValuesIn(kCallbackRows),
                         [](const auto& info) { return info.param.interface; });

TEST_P(ManagerCallbackStub, HandsTheRecordOnInPlace) {
    fill(0);
    const uint8_t* end = mData.data() + mData.dataSize();
    EXPECT_EQ(android::NO_ERROR, inject());
    EXPECT_EQ(Recording::Calls{GetParam().operation + "(1 record)"}, mStub.recording.calls);
    EXPECT_EQ(Recording::Addresses{end - GetParam().size}, mStub.recording.addresses);
}

TEST_P(ManagerCallbackStub, HandsNullOnForAnIncompleteRecord) {
    mStub.recording.status = STATUS_NULL_POINTER;
    for (size_t missing : {size_t{1}, size_t{4}, GetParam().size}) {
        mData.freeData();
        mReply.freeData();
        mStub.recording.calls.clear();
        fill(missing);
        EXPECT_EQ(android::NO_ERROR, inject());
        EXPECT_EQ(Recording::Calls{GetParam().operation + "(null)"}, mStub.recording.calls);
        EXPECT_EQ(STATUS_NULL_POINTER, mReply.readInt32());
    }
}

TEST(GestureManagerStub, HandsTheSamplesOnInPlace) {
    const sp<RecordingGestureManagerService> service = new RecordingGestureManagerService;
    Parcel data;
    writeToken(data, "pemaro.GestureManagerService");
    data.writeInt32(3);
    writeRecords<Gesture>(data, 3);
    Parcel reply;
    EXPECT_EQ(android::NO_ERROR, service->transact(7, data, &reply));
    EXPECT_EQ(Recording::Calls{"addGesture(3, 3 records)"}, service->calls);
    EXPECT_EQ(Recording::Addresses{data.data() + data.dataSize() - 216432}, service->addresses);
}

TEST(HandBiometricManagerStub, HandsTheNamesOnInPlace) {
    const sp<RecordingHandBiometricManagerService> service =
            new RecordingHandBiometricManagerService;
    Parcel data;
    writeToken(data, "pemaro.HandBiometricManagerService");
    names({"A", "B"})(data);
    const uint8_t* first = data.data() + data.dataSize() - 8;  // each name takes four bytes
    Parcel reply;
    EXPECT_EQ(android::NO_ERROR, service->transact(12, data, &reply));
    EXPECT_EQ(Recording::Calls{"renameProfile('A', 'B')"}, service->calls);
    EXPECT_EQ((Recording::Addresses{first, first + 4}), service->addresses);
}

}  // namespace
}  // namespace pemaro::test
