// SPDX-License-Identifier: Apache-2.0
// The stubs of the managers: for each transaction the call that it makes, the reply that it writes
// and what it logs, and what it makes of requests that are not whole.

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <functional>
#include <ostream>
#include <string>
#include <vector>

#include "pemaro/Status.h"
#include "tests/managers/ManagerMocks.h"
#include "tests/managers/ManagerParcels.h"
#include "tests/support/LogLines.h"

namespace pemaro::test {
namespace {

using android::IBinder;
using android::Parcel;
using android::Rect;
using android::sp;
using android::status_t;
using ::testing::_;
using ::testing::DoAll;
using ::testing::ElementsAre;
using ::testing::ElementsAreArray;
using ::testing::IsEmpty;
using ::testing::IsNull;
using ::testing::Return;
using ::testing::SetArgReferee;
using ::testing::StrEq;
using ::testing::StrictMock;

using TouchGesture = ITouchManagerClient::GestureData;
using Gesture = IGestureManagerClient::GestureData;
using HandEvent = IHandBiometricManagerClient::HandBioData;

void noBinder(Parcel& parcel) {
    parcel.writeStrongBinder(nullptr);
}

/// A stub that expects exactly one call, which returns `status`.
using Expecting = std::function<sp<IBinder>(int status)>;

// A plain pointer: one instance of this for each kind of stub, not one for each row.
template <typename Mock>
Expecting stub(void (*expect)(Mock& mock, int status)) {
    return [expect](int status) -> sp<IBinder> {
        sp<Mock> mock = new StrictMock<Mock>;
        expect(*mock, status);
        return mock;
    };
}

Expecting touchStub(void (*expect)(MockTouchManagerService& service, int status)) {
    return stub(expect);
}

Expecting gestureStub(void (*expect)(MockGestureManagerService& service, int status)) {
    return stub(expect);
}

Expecting handStub(void (*expect)(MockHandBiometricManagerService& service, int status)) {
    return stub(expect);
}

MATCHER_P4(IsRegion, left, top, right, bottom, "") {
    return arg.left == left && arg.top == top && arg.right == right && arg.bottom == bottom;
}

// What a call leaves in its out-argument before it returns.
template <size_t kArgument, typename Value>
auto answers(Value value, int status) {
    return DoAll(SetArgReferee<kArgument>(value), Return(status));
}

struct StubRow {
    const char* name;
    const char* interface;
    uint32_t code;
    ParcelWriter arguments;  // what follows the token
    Expecting stub;
    ParcelWriter values;  // what precedes the status in the reply
    Lines log;
};

void PrintTo(const StubRow& row, std::ostream* out) {
    *out << row.name;
}

const StubRow kStubRows[] = {
        {"touchSubscribe",
         kTouch,
         1,
         noBinder,
         touchStub([](auto& s, int status) {
             EXPECT_CALL(s, subscribe(IsNull())).WillOnce(Return(status));
         }),
         nothing,
         {"D SUBSCRIBE transact received..."}},
        {"touchUnsubscribe",
         kTouch,
         2,
         noBinder,
         touchStub([](auto& s, int status) {
             EXPECT_CALL(s, unsubscribe(IsNull())).WillOnce(Return(status));
         }),
         nothing,
         {"D UNSUBSCRIBE transact received..."}},
        {"touchIsSupported",
         kTouch,
         3,
         numbers({-7}),
         touchStub([](auto& s, int status) {
             EXPECT_CALL(s, isSupported(-7, _)).WillOnce(answers<1>(true, status));
         }),
         numbers({1}),
         {"D IS_SUPPORTED transact received..."}},
        {"touchIsNotSupported",
         kTouch,
         3,
         numbers({7}),
         touchStub([](auto& s, int status) {
             EXPECT_CALL(s, isSupported(7, _)).WillOnce(answers<1>(false, status));
         }),
         numbers({0}),
         {"D IS_SUPPORTED transact received..."}},
        {"touchIsEnabled",
         kTouch,
         4,
         numbers({8}),
         touchStub([](auto& s, int status) {
             EXPECT_CALL(s, isEnabled(8, _)).WillOnce(answers<1>(true, status));
         }),
         numbers({1}),
         {"D IS_ENABLED transact received..."}},
        {"touchIsNotEnabled",
         kTouch,
         4,
         numbers({8}),
         touchStub([](auto& s, int status) {
             EXPECT_CALL(s, isEnabled(8, _)).WillOnce(answers<1>(false, status));
         }),
         numbers({0}),
         {"D IS_ENABLED transact received..."}},
        {"touchEnable",
         kTouch,
         5,
         numbers({9}),
         touchStub([](auto& s, int status) { EXPECT_CALL(s, enable(9)).WillOnce(Return(status)); }),
         nothing,
         {"D ENABLE transact received..."}},
        {"touchDisable",
         kTouch,
         6,
         numbers({10}),
         touchStub(
                 [](auto& s, int status) { EXPECT_CALL(s, disable(10)).WillOnce(Return(status)); }),
         nothing,
         {"D DISABLE transact received..."}},
        // Top, left, bottom, right.
        {"touchConfigureVmRegionOn",
         kTouch,
         7,
         numbers({2, 1, 4, 3, 1}),
         touchStub([](auto& s, int status) {
             EXPECT_CALL(s, configure_vm_region(IsRegion(1, 2, 3, 4), true))
                     .WillOnce(Return(status));
         }),
         nothing,
         {"D CONFIGURE_VM_REGION transact received..."}},
        {"touchConfigureVmRegionOff",
         kTouch,
         7,
         numbers({-2, -1, -4, -3, 0}),
         touchStub([](auto& s, int status) {
             EXPECT_CALL(s, configure_vm_region(IsRegion(-1, -2, -3, -4), false))
                     .WillOnce(Return(status));
         }),
         nothing,
         {"D CONFIGURE_VM_REGION transact received..."}},
        {"touchConfigureVmRegionWithAnyFlag",
         kTouch,
         7,
         numbers({2, 1, 4, 3, 7}),
         touchStub([](auto& s, int status) {
             EXPECT_CALL(s, configure_vm_region(_, true)).WillOnce(Return(status));
         }),
         nothing,
         {"D CONFIGURE_VM_REGION transact received..."}},
        {"touchGestureCallback",
         "TouchManagerClient",
         1,
         [](Parcel& p) { writeRecords<TouchGesture>(p, 1); },
         stub<MockTouchManagerClient>([](auto& c, int status) {
             EXPECT_CALL(c, gestureCallback(HoldsRecords(1u))).WillOnce(Return(status));
         }),
         nothing,
         {"D INJECT_GESTURE transact received..."}},

        {"gestureSubscribe",
         kGesture,
         1,
         noBinder,
         gestureStub([](auto& s, int status) {
             EXPECT_CALL(s, subscribe(IsNull())).WillOnce(Return(status));
         }),
         nothing,
         {"D SUBSCRIBE transact received..."}},
        {"gestureUnsubscribe",
         kGesture,
         2,
         noBinder,
         gestureStub([](auto& s, int status) {
             EXPECT_CALL(s, unsubscribe(IsNull())).WillOnce(Return(status));
         }),
         nothing,
         {"D UNSUBSCRIBE transact received..."}},
        {"gestureEnableWakeup",
         kGesture,
         3,
         nothing,
         gestureStub([](auto& s, int status) {
             EXPECT_CALL(s, enableWakeup()).WillOnce(Return(status));
         }),
         nothing,
         {"D ENABLE_WAKEUP transact received..."}},
        {"gestureDisableWakeup",
         kGesture,
         4,
         nothing,
         gestureStub([](auto& s, int status) {
             EXPECT_CALL(s, disableWakeup()).WillOnce(Return(status));
         }),
         nothing,
         {"D DISABLE_WAKEUP transact received..."}},
        {"gestureStartDetection",
         kGesture,
         5,
         nothing,
         gestureStub([](auto& s, int status) {
             EXPECT_CALL(s, startGestureDetection()).WillOnce(Return(status));
         }),
         nothing,
         {"D ENABLE transact received..."}},
        {"gestureStopDetection",
         kGesture,
         6,
         nothing,
         gestureStub([](auto& s, int status) {
             EXPECT_CALL(s, stopGestureDetection()).WillOnce(Return(status));
         }),
         nothing,
         {"D DISABLE transact received..."}},
        {"gestureAddThree",
         kGesture,
         7,
         [](Parcel& p) {
             p.writeInt32(3);
             writeRecords<Gesture>(p, 3);
         },
         gestureStub([](auto& s, int status) {
             EXPECT_CALL(s, addGesture(3, HoldsRecords(3u), _)).WillOnce(answers<2>(-4, status));
         }),
         numbers({-4}),
         {"D ADD_GESTURE transact received..."}},
        {"gestureAddNone",
         kGesture,
         7,
         numbers({0}),
         gestureStub([](auto& s, int status) {
             EXPECT_CALL(s, addGesture(0, _, _)).WillOnce(answers<2>(4, status));
         }),
         numbers({4}),
         {"D ADD_GESTURE transact received..."}},
        {"gestureAddNegative",
         kGesture,
         7,
         [](Parcel& p) {
             p.writeInt32(-1);
             writeRecords<Gesture>(p, 1);
         },
         gestureStub([](auto& s, int status) {
             EXPECT_CALL(s, addGesture(-1, IsNull(), _)).WillOnce(answers<2>(4, status));
         }),
         numbers({4}),
         {"D ADD_GESTURE transact received..."}},
        {"gestureAddMostNegative",
         kGesture,
         7,
         numbers({INT32_MIN}),
         gestureStub([](auto& s, int status) {
             EXPECT_CALL(s, addGesture(INT32_MIN, IsNull(), _)).WillOnce(answers<2>(4, status));
         }),
         numbers({4}),
         {"D ADD_GESTURE transact received..."}},
        {"gestureAddMoreThanThereIs",
         kGesture,
         7,
         [](Parcel& p) {
             p.writeInt32(4);
             writeRecords<Gesture>(p, 3);
         },
         gestureStub([](auto& s, int status) {
             EXPECT_CALL(s, addGesture(4, IsNull(), _)).WillOnce(answers<2>(4, status));
         }),
         numbers({4}),
         {"D ADD_GESTURE transact received..."}},
        {"gestureAddMoreThanAnyRequestHolds",
         kGesture,
         7,
         [](Parcel& p) {
             p.writeInt32(INT32_MAX);
             writeRecords<Gesture>(p, 1);
         },
         gestureStub([](auto& s, int status) {
             EXPECT_CALL(s, addGesture(INT32_MAX, IsNull(), _)).WillOnce(answers<2>(4, status));
         }),
         numbers({4}),
         {"D ADD_GESTURE transact received..."}},
        {"gestureDelete",
         kGesture,
         8,
         numbers({-3}),
         gestureStub([](auto& s, int status) {
             EXPECT_CALL(s, deleteGesture(-3)).WillOnce(Return(status));
         }),
         nothing,
         {"D DELETE_GESTURE transact received..."}},
        {"gestureEnable",
         kGesture,
         9,
         numbers({4}),
         gestureStub([](auto& s, int status) {
             EXPECT_CALL(s, enableGesture(4)).WillOnce(Return(status));
         }),
         nothing,
         {"D ENABLE_GESTURE transact received..."}},
        {"gestureDisable",
         kGesture,
         10,
         numbers({5}),
         gestureStub([](auto& s, int status) {
             EXPECT_CALL(s, disableGesture(5)).WillOnce(Return(status));
         }),
         nothing,
         {"D DISABLE_GESTURE transact received..."}},
        {"gestureVerify",
         kGesture,
         11,
         [](Parcel& p) { writeRecords<Gesture>(p, 1); },
         gestureStub([](auto& s, int status) {
             EXPECT_CALL(s, improveGestureTraining(HoldsRecords(1u), _))
                     .WillOnce(answers<1>(2, status));
         }),
         numbers({2}),
         {"D VERIFY_GESTURE transact received..."}},
        {"gestureVerifyNothing",
         kGesture,
         11,
         nothing,
         gestureStub([](auto& s, int status) {
             EXPECT_CALL(s, improveGestureTraining(IsNull(), _)).WillOnce(answers<1>(2, status));
         }),
         numbers({2}),
         {"D VERIFY_GESTURE transact received..."}},
        {"gestureMaxPreDefined",
         kGesture,
         12,
         nothing,
         gestureStub([](auto& s, int status) {
             EXPECT_CALL(s, getMaxPreDefinedGesture(_)).WillOnce(answers<0>(0xffffffffu, status));
         }),
         numbers({-1}),
         {"D GET_MAX_PREDEFINED_GESTURE transact received...",
          "D GET_MAX_PREDEFINED_GESTURE transact finished..."}},
        {"gestureMaxUserDefined",
         kGesture,
         13,
         nothing,
         gestureStub([](auto& s, int status) {
             EXPECT_CALL(s, getMaxUserDefinedGesture(_)).WillOnce(answers<0>(8u, status));
         }),
         numbers({8}),
         {"D GET_MAX_USERDEFINED_GESTURE transact received...",
          "D GET_MAX_USERDEFINED_GESTURE transact finished..."}},
        {"gestureGestureCallback",
         "GestureManagerClient",
         1,
         [](Parcel& p) { writeRecords<Gesture>(p, 1); },
         stub<MockGestureManagerClient>([](auto& c, int status) {
             EXPECT_CALL(c, gestureCallback(HoldsRecords(1u))).WillOnce(Return(status));
         }),
         nothing,
         {"D INJECT_GESTURE transact received..."}},

        {"handSubscribe",
         kHand,
         1,
         noBinder,
         handStub([](auto& s, int status) {
             EXPECT_CALL(s, subscribe(IsNull())).WillOnce(Return(status));
         }),
         nothing,
         {"D SUBSCRIBE transact received..."}},
        {"handUnsubscribe",
         kHand,
         2,
         noBinder,
         handStub([](auto& s, int status) {
             EXPECT_CALL(s, unsubscribe(IsNull())).WillOnce(Return(status));
         }),
         nothing,
         {"D UNSUBSCRIBE transact received..."}},
        {"handStartEnrollment",
         kHand,
         3,
         nothing,
         handStub([](auto& s, int status) {
             EXPECT_CALL(s, startEnrollment()).WillOnce(Return(status));
         }),
         nothing,
         {"D START_ENROLLMENT transact received..."}},
        {"handStopEnrollment",
         kHand,
         4,
         nothing,
         handStub([](auto& s, int status) {
             EXPECT_CALL(s, stopEnrollment()).WillOnce(Return(status));
         }),
         nothing,
         {"D STOP_ENROLLMENT transact received..."}},
        {"handScan",
         kHand,
         5,
         nothing,
         handStub([](auto& s, int status) { EXPECT_CALL(s, scan()).WillOnce(Return(status)); }),
         nothing,
         {"D SCAN transact received..."}},
        {"handStartMatching",
         kHand,
         6,
         nothing,
         handStub([](auto& s, int status) {
             EXPECT_CALL(s, startMatching()).WillOnce(Return(status));
         }),
         nothing,
         {"D START_MATCHING transact received..."}},
        {"handStopMatching",
         kHand,
         7,
         nothing,
         handStub([](auto& s, int status) {
             EXPECT_CALL(s, stopMatching()).WillOnce(Return(status));
         }),
         nothing,
         {"D STOP_MATCHING transact received..."}},
        {"handCancelScan",
         kHand,
         8,
         nothing,
         handStub([](auto& s, int status) {
             EXPECT_CALL(s, cancelScan()).WillOnce(Return(status));
         }),
         nothing,
         {"D CANCEL_SCAN transact received..."}},
        {"handSetSecurity",
         kHand,
         9,
         numbers({-2}),
         handStub([](auto& s, int status) {
             EXPECT_CALL(s, setSecurity(-2)).WillOnce(Return(status));
         }),
         nothing,
         {"D SET_SECURITY transact received..."}},
        {"handSetProfileName",
         kHand,
         10,
         names({"alice"}),
         handStub([](auto& s, int status) {
             EXPECT_CALL(s, setProfileName(StrEq("alice"))).WillOnce(Return(status));
         }),
         nothing,
         {"D SET_PROFILENAME transact received..."}},
        {"handSetNoProfileName",
         kHand,
         10,
         nothing,
         handStub([](auto& s, int status) {
             EXPECT_CALL(s, setProfileName(IsNull())).WillOnce(Return(status));
         }),
         nothing,
         {"D SET_PROFILENAME transact received..."}},
        {"handSetProfileNameThatDoesNotEnd",
         kHand,
         10,
         numbers({0x41414141}),
         handStub([](auto& s, int status) {
             EXPECT_CALL(s, setProfileName(IsNull())).WillOnce(Return(status));
         }),
         nothing,
         {"D SET_PROFILENAME transact received..."}},
        {"handDeleteProfile",
         kHand,
         11,
         names({""}),
         handStub([](auto& s, int status) {
             EXPECT_CALL(s, deleteProfile(StrEq(""))).WillOnce(Return(status));
         }),
         nothing,
         {"D DELETE_PROFILE transact received..."}},
        {"handDeleteNoProfile",
         kHand,
         11,
         nothing,
         handStub([](auto& s, int status) {
             EXPECT_CALL(s, deleteProfile(IsNull())).WillOnce(Return(status));
         }),
         nothing,
         {"D DELETE_PROFILE transact received..."}},
        {"handRenameProfile",
         kHand,
         12,
         names({"A", "B"}),
         handStub([](auto& s, int status) {
             EXPECT_CALL(s, renameProfile(StrEq("A"), StrEq("B"))).WillOnce(Return(status));
         }),
         nothing,
         {"D RENAME_PROFILE transact received..."}},
        {"handRenameProfileToNothing",
         kHand,
         12,
         names({"A"}),
         handStub([](auto& s, int status) {
             EXPECT_CALL(s, renameProfile(StrEq("A"), IsNull())).WillOnce(Return(status));
         }),
         nothing,
         {"D RENAME_PROFILE transact received..."}},
        {"handGetMaxUser",
         kHand,
         13,
         nothing,
         handStub(
                 [](auto& s, int status) {
                     EXPECT_CALL(s, getMaxUser(_)).WillOnce(answers<0>(5u, status));
                 }),
         numbers({5}),
         {"D GET_MAXUSER transact received...", "D GET_MAXUSER transact finished..."}},
        {"handGetProfileListOfNone",
         kHand,
         14,
         nothing,
         handStub(
                 [](auto& s, int status) {
                     EXPECT_CALL(s, getProfileList(IsEmpty())).WillOnce(Return(status));
                 }),
         numbers({0}),
         {"D GET_PROFILELIST transact received...", "D GET_PROFILELIST transact finished..."}},
        {"handGetProfileListOfTwo",
         kHand,
         14,
         nothing,
         handStub(
                 [](auto& s, int status) {
                     const std::vector<std::string> list = {"alice", "bob"};
                     EXPECT_CALL(s, getProfileList(IsEmpty())).WillOnce(answers<0>(list, status));
                 }),
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
         handStub([](auto& s,
                     int status) { EXPECT_CALL(s, enableWakeup()).WillOnce(Return(status)); }),
         nothing,
         {"D ENABLE_WAKEUP transact received..."}},
        {"handDisableWakeup",
         kHand,
         16,
         nothing,
         handStub([](auto& s,
                     int status) { EXPECT_CALL(s, disableWakeup()).WillOnce(Return(status)); }),
         nothing,
         {"D DISABLE_WAKEUP transact received..."}},
        {"handCallback",
         "HandBiometricManagerClient",
         1,
         [](Parcel& p) { writeRecords<HandEvent>(p, 1); },
         stub<MockHandBiometricManagerClient>([](auto& c, int status) {
             EXPECT_CALL(c, handBiometricCallback(HoldsRecords(1u))).WillOnce(Return(status));
         }),
         nothing,
         {"D INJECT_HANDBIOMETRIC transact received..."}},
};

class ManagerStubRow : public ::testing::TestWithParam<StubRow> {
  protected:
    void fill(Parcel& data) const {
        writeToken(data, std::string("pemaro.") + GetParam().interface);
        GetParam().arguments(data);
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
        EXPECT_EQ(android::NO_ERROR,
                  GetParam().stub(status)->transact(GetParam().code, data, &reply));
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
    EXPECT_EQ(android::NO_ERROR, GetParam().stub(0)->transact(GetParam().code, data, nullptr));
}

// ---- the token and the range of codes ----

template <typename M, uint32_t kLast>
struct StubCase {
    using Mock = M;
    static constexpr uint32_t kLastCode = kLast;
};

using StubCases = ::testing::Types<
        StubCase<MockTouchManagerService, 7>, StubCase<MockTouchManagerClient, 1>,
        StubCase<MockGestureManagerService, 13>, StubCase<MockGestureManagerClient, 1>,
        StubCase<MockHandBiometricManagerService, 16>, StubCase<MockHandBiometricManagerClient, 1>>;

template <typename T>
class ManagerStub : public ::testing::Test {
  protected:
    // Strict: any call fails the test.
    const sp<typename T::Mock> mStub = new StrictMock<typename T::Mock>;
    Parcel mReply;
};
TYPED_TEST_SUITE(ManagerStub, StubCases);

TYPED_TEST(ManagerStub, RefusesEveryRequestWithoutTheToken) {
    std::vector<uint32_t> codes = {0, TypeParam::kLastCode + 1, IBinder::LAST_CALL_TRANSACTION,
                                   IBinder::INTERFACE_TRANSACTION, IBinder::DUMP_TRANSACTION};
    for (uint32_t code = 1; code <= TypeParam::kLastCode; ++code) {
        codes.push_back(code);
    }
    for (uint32_t code : codes) {
        Parcel empty;
        EXPECT_EQ(-1, this->mStub->transact(code, empty, &this->mReply)) << code;
        Parcel foreign;
        writeToken(foreign, "pemaro.TouchService");
        EXPECT_EQ(-1, this->mStub->transact(code, foreign, &this->mReply)) << code;
    }
    EXPECT_THAT(bytesOf(this->mReply), IsEmpty());
}

TYPED_TEST(ManagerStub, LeavesOtherCodesToThePlatform) {
    const android::String16 descriptor = this->mStub->getInterfaceDescriptor();
    for (uint32_t code : {0u, TypeParam::kLastCode + 1, uint32_t{IBinder::LAST_CALL_TRANSACTION}}) {
        Parcel data;
        data.writeInterfaceToken(descriptor);
        EXPECT_EQ(android::UNKNOWN_TRANSACTION, this->mStub->transact(code, data, &this->mReply))
                << code;
        EXPECT_THAT(bytesOf(this->mReply), IsEmpty());
    }
    Parcel query;
    query.writeInterfaceToken(descriptor);
    EXPECT_EQ(android::NO_ERROR,
              this->mStub->transact(IBinder::INTERFACE_TRANSACTION, query, &this->mReply));
    EXPECT_EQ(parcelBytes([&](Parcel& p) { p.writeString16(descriptor); }), bytesOf(this->mReply));
}

// ---- callback objects ----

template <typename Service, typename Client>
void expectObjectHandedOn(const char* descriptor) {
    const sp<Client> client = new Client;
    const sp<Service> service = new StrictMock<Service>;
    EXPECT_CALL(*service, subscribe(_)).WillOnce([&](const auto& given) {
        EXPECT_EQ(client, given);
        return 0;
    });
    EXPECT_CALL(*service, unsubscribe(_)).WillOnce([&](const auto& given) {
        EXPECT_EQ(client, given);
        return 0;
    });
    for (uint32_t code : {1, 2}) {
        Parcel data;
        Parcel reply;
        writeToken(data, descriptor);
        data.writeStrongBinder(client);
        EXPECT_EQ(android::NO_ERROR, service->transact(code, data, &reply));
    }
}

TEST(ManagerSubscriptionStub, HandsTheCallbackObjectOn) {
    expectObjectHandedOn<MockTouchManagerService, MockTouchManagerClient>(
            "pemaro.TouchManagerService");
    expectObjectHandedOn<MockGestureManagerService, MockGestureManagerClient>(
            "pemaro.GestureManagerService");
    expectObjectHandedOn<MockHandBiometricManagerService, MockHandBiometricManagerClient>(
            "pemaro.HandBiometricManagerService");
}

// ---- records in place ----

// The callback under its name in each interface.
template <typename Function>
void expectRecord(MockTouchManagerClient& client, Function check) {
    EXPECT_CALL(client, gestureCallback(_)).WillOnce(check);
}

template <typename Function>
void expectRecord(MockGestureManagerClient& client, Function check) {
    EXPECT_CALL(client, gestureCallback(_)).WillOnce(check);
}

template <typename Function>
void expectRecord(MockHandBiometricManagerClient& client, Function check) {
    EXPECT_CALL(client, handBiometricCallback(_)).WillOnce(check);
}

template <typename M, typename R>
struct RecordCase {
    using Mock = M;
    using Record = R;
};

using Callbacks = ::testing::Types<RecordCase<MockTouchManagerClient, TouchGesture>,
                                   RecordCase<MockGestureManagerClient, Gesture>,
                                   RecordCase<MockHandBiometricManagerClient, HandEvent>>;

template <typename T>
class ManagerCallbackStub : public ::testing::Test {
  protected:
    using Record = typename T::Record;

    /// A request with one record, cut to all but its last `missing` bytes.
    void fill(size_t missing) {
        mData.writeInterfaceToken(mClient->getInterfaceDescriptor());
        writeRecords<Record>(mData, 1);
        mData.setDataSize(mData.dataSize() - missing);
    }

    status_t inject() { return mClient->transact(1, mData, &mReply); }

    const sp<typename T::Mock> mClient = new StrictMock<typename T::Mock>;
    Parcel mData;
    Parcel mReply;
};
TYPED_TEST_SUITE(ManagerCallbackStub, Callbacks);

TYPED_TEST(ManagerCallbackStub, HandsTheRecordOnInPlace) {
    using Record = typename TypeParam::Record;
    this->fill(0);
    const uint8_t* end = this->mData.data() + this->mData.dataSize();
    expectRecord(*this->mClient, [&](Record* record) {
        EXPECT_EQ(end - sizeof(Record), reinterpret_cast<const uint8_t*>(record));
        EXPECT_THAT(record, HoldsRecords(1u));
        return 0;
    });
    EXPECT_EQ(android::NO_ERROR, this->inject());
}

TYPED_TEST(ManagerCallbackStub, HandsNullOnForAnIncompleteRecord) {
    using Record = typename TypeParam::Record;
    for (size_t missing : {size_t{1}, size_t{4}, sizeof(Record)}) {
        this->mData.freeData();
        this->mReply.freeData();
        this->fill(missing);
        expectRecord(*this->mClient, [](Record* record) {
            EXPECT_EQ(nullptr, record);
            return STATUS_NULL_POINTER;
        });
        EXPECT_EQ(android::NO_ERROR, this->inject());
        EXPECT_EQ(STATUS_NULL_POINTER, this->mReply.readInt32());
    }
}

TEST(GestureManagerStub, HandsTheSamplesOnInPlace) {
    const sp<MockGestureManagerService> service = new StrictMock<MockGestureManagerService>;
    Parcel data;
    writeToken(data, "pemaro.GestureManagerService");
    data.writeInt32(3);
    writeRecords<Gesture>(data, 3);
    const uint8_t* end = data.data() + data.dataSize();
    EXPECT_CALL(*service, addGesture(3, _, _)).WillOnce([&](int, Gesture* samples, int& result) {
        EXPECT_EQ(end - 216432, reinterpret_cast<const uint8_t*>(samples));
        result = 1;
        return 0;
    });
    Parcel reply;
    EXPECT_EQ(android::NO_ERROR, service->transact(7, data, &reply));
}

TEST(HandBiometricManagerStub, HandsTheNamesOnInPlace) {
    const sp<MockHandBiometricManagerService> service =
            new StrictMock<MockHandBiometricManagerService>;
    Parcel data;
    writeToken(data, "pemaro.HandBiometricManagerService");
    names({"A", "B"})(data);
    const uint8_t* first = data.data() + data.dataSize() - 8;  // each name takes four bytes
    EXPECT_CALL(*service, renameProfile(_, _)).WillOnce([&](const char* a, const char* b) {
        EXPECT_EQ(first, reinterpret_cast<const uint8_t*>(a));
        EXPECT_EQ(first + 4, reinterpret_cast<const uint8_t*>(b));
        return 0;
    });
    Parcel reply;
    EXPECT_EQ(android::NO_ERROR, service->transact(12, data, &reply));
}

}  // namespace
}  // namespace pemaro::test
