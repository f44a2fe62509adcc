// SPDX-License-Identifier: Apache-2.0
// The operations that the manager clients pass on to their services: what each sends, and what it
// logs when it fails.

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <ostream>
#include <string>
#include <vector>

#include "pemaro/GestureManagerClient.h"
#include "pemaro/HandBiometricManagerClient.h"
#include "pemaro/Status.h"
#include "pemaro/TouchManagerClient.h"
#include "pemaro/testkit/FakeServiceManager.h"
#include "tests/managers/ManagerParcels.h"
#include "tests/support/LogLines.h"
#include "tests/support/RecordingBinder.h"

namespace pemaro::test {
namespace {

using android::Parcel;
using android::Rect;
using android::sp;
using ::testing::ElementsAre;
using ::testing::IsEmpty;

using Gesture = IGestureManagerClient::GestureData;

struct Clients {
    const sp<TouchManagerClient> touch = new TouchManagerClient;
    const sp<GestureManagerClient> gesture = new GestureManagerClient;
    const sp<HandBiometricManagerClient> hand = new HandBiometricManagerClient;
};

struct OperationRow {
    const char* name;
    const char* manager;
    int (*call)(Clients& clients);
    uint32_t code;
    ParcelWriter arguments;
    ParcelWriter values;  // what precedes the status in the reply
    const char* failure;  // up to the message
};

void PrintTo(const OperationRow& row, std::ostream* out) {
    *out << row.name;
}

const char kTouchManager[] = "TouchManager";
const char kGestureManager[] = "GestureManager";
const char kHandManager[] = "HandBiometricManager";

const OperationRow kOperationRows[] = {
        {"touchIsSupported", kTouchManager,
         [](Clients& c) { return c.touch->isSupported(7, gAnswer); }, 3, numbers({7}), numbers({1}),
         "isSupported failed: "},
        {"touchIsEnabled", kTouchManager, [](Clients& c) { return c.touch->isEnabled(8, gAnswer); },
         4, numbers({8}), numbers({1}), "isEnabled failed: "},
        {"touchEnable", kTouchManager, [](Clients& c) { return c.touch->enable(9); }, 5,
         numbers({9}), nothing, "enable failed: "},
        {"touchDisable", kTouchManager, [](Clients& c) { return c.touch->disable(10); }, 6,
         numbers({10}), nothing, "disable failed: "},
        {"touchConfigureVmRegion", kTouchManager,
         [](Clients& c) {
             Rect region(1, 2, 3, 4);
             return c.touch->configure_vm_region(region, true);
         },
         7, numbers({2, 1, 4, 3, 1}), nothing, "disable failed: "},

        {"gestureEnableWakeup", kGestureManager,
         [](Clients& c) { return c.gesture->enableWakeup(); }, 3, nothing, nothing,
         "enable failed: "},
        {"gestureDisableWakeup", kGestureManager,
         [](Clients& c) { return c.gesture->disableWakeup(); }, 4, nothing, nothing,
         "disable failed: "},
        {"gestureStartDetection", kGestureManager,
         [](Clients& c) { return c.gesture->startGestureDetection(); }, 5, nothing, nothing,
         "enable failed: "},
        {"gestureStopDetection", kGestureManager,
         [](Clients& c) { return c.gesture->stopGestureDetection(); }, 6, nothing, nothing,
         "enable failed: "},
        {"gestureAdd", kGestureManager,
         [](Clients& c) {
             return c.gesture->addGesture(2, makeRecords<Gesture>(2).data(), gResult);
         },
         7,
         [](Parcel& p) {
             p.writeInt32(2);
             writeRecords<Gesture>(p, 2);
         },
         numbers({4}), "addGesture failed: "},
        {"gestureDelete", kGestureManager, [](Clients& c) { return c.gesture->deleteGesture(3); },
         8, numbers({3}), nothing, "deleteGesture failed: "},
        {"gestureEnable", kGestureManager, [](Clients& c) { return c.gesture->enableGesture(4); },
         9, numbers({4}), nothing, "enableGesture failed: "},
        {"gestureDisable", kGestureManager, [](Clients& c) { return c.gesture->disableGesture(5); },
         10, numbers({5}), nothing, "disableGesture failed: "},
        {"gestureVerify", kGestureManager,
         [](Clients& c) {
             return c.gesture->verifyGesture(makeRecords<Gesture>(1).data(), gResult);
         },
         11, [](Parcel& p) { writeRecords<Gesture>(p, 1); }, numbers({2}),
         "improveGestureTraining failed: "},
        {"gestureMaxPreDefined", kGestureManager,
         [](Clients& c) { return c.gesture->getMaxPreDefinedGesture(gCount); }, 12, nothing,
         numbers({8}), "getMaxPreDefinedGesture failed: "},
        {"gestureMaxUserDefined", kGestureManager,
         [](Clients& c) { return c.gesture->getMaxUserDefinedGesture(gCount); }, 13, nothing,
         numbers({8}), "getMaxUserDefinedGesture failed: "},

        {"handStartEnrollment", kHandManager, [](Clients& c) { return c.hand->startEnrollment(); },
         3, nothing, nothing, "startEnrollment failed: "},
        {"handStopEnrollment", kHandManager, [](Clients& c) { return c.hand->stopEnrollment(); }, 4,
         nothing, nothing, "stopEnrollment failed: "},
        {"handScan", kHandManager, [](Clients& c) { return c.hand->scan(); }, 5, nothing, nothing,
         "scan failed: "},
        {"handStartMatching", kHandManager, [](Clients& c) { return c.hand->startMatching(); }, 6,
         nothing, nothing, "startMatching failed: "},
        {"handStopMatching", kHandManager, [](Clients& c) { return c.hand->stopMatching(); }, 7,
         nothing, nothing, "stopMatching failed: "},
        {"handCancelScan", kHandManager, [](Clients& c) { return c.hand->cancelScan(); }, 8,
         nothing, nothing, "cancelScan failed: "},
        {"handSetSecurity", kHandManager, [](Clients& c) { return c.hand->setSecurity(2); }, 9,
         numbers({2}), nothing, "setSecurity failed: "},
        {"handSetProfileName", kHandManager,
         [](Clients& c) { return c.hand->setProfileName("alice"); }, 10, names({"alice"}), nothing,
         "setProfileName failed: "},
        {"handDeleteProfile", kHandManager, [](Clients& c) { return c.hand->deleteProfile("bob"); },
         11, names({"bob"}), nothing, "setProfileName failed: "},
        {"handRenameProfile", kHandManager,
         [](Clients& c) { return c.hand->renameProfile("A", "B"); }, 12, names({"A", "B"}), nothing,
         "setProfileName failed: "},
        {"handGetMaxUser", kHandManager, [](Clients& c) { return c.hand->getMaxUser(gCount); }, 13,
         nothing, numbers({5}), "getMaxUser failed: "},
        {"handGetProfileList", kHandManager,
         [](Clients& c) { return c.hand->getProfileList(gNames); }, 14, nothing, numbers({0}),
         "getProfileList failed: "},
        {"handEnableWakeup", kHandManager, [](Clients& c) { return c.hand->enableWakeup(); }, 15,
         nothing, nothing, "enable failed: "},
        {"handDisableWakeup", kHandManager, [](Clients& c) { return c.hand->disableWakeup(); }, 16,
         nothing, nothing, "disable failed: "},
};

class ManagerOperations : public ::testing::Test {
  protected:
    ManagerOperations() {
        for (const char* manager : {kTouchManager, kGestureManager, kHandManager}) {
            mServices->add(std::string("pemaro.") + manager + "Service", mRemote);
        }
    }

    void connect() {
        mRemote->answer(numbers({0}));
        ASSERT_EQ(0, mClients.touch->init());
        ASSERT_EQ(0, mClients.gesture->init());
        ASSERT_EQ(0, mClients.hand->init());
        mRemote->clearTransactions();
        clearLog();
    }

    ScopedServiceManager mServices;
    const sp<RecordingBinder> mRemote = new RecordingBinder;
    Clients mClients;
};

class ManagerOperationRow : public ManagerOperations,
                            public ::testing::WithParamInterface<OperationRow> {
  protected:
    std::string tag() const { return std::string(GetParam().manager) + "Client"; }

    std::string failure(int status) const {
        return std::string("E ") + GetParam().failure + errStr(status);
    }

    void answer(int status) {
        mRemote->answer([=](Parcel& reply) {
            GetParam().values(reply);
            reply.writeInt32(status);
        });
    }
};

INSTANTIATE_TEST_SUITE_P(EveryOperation, ManagerOperationRow, ::testing::ValuesIn(kOperationRows),
                         [](const auto& info) { return info.param.name; });

TEST_P(ManagerOperationRow, ReachesTheService) {
    connect();
    answer(0);
    EXPECT_EQ(0, GetParam().call(mClients));
    ASSERT_EQ(1u, mRemote->transactions().size());
    const RecordingBinder::Transaction sent = mRemote->lastTransaction();
    EXPECT_EQ(GetParam().code, sent.code);
    EXPECT_TRUE(requestBytes(std::string("pemaro.") + GetParam().manager + "Service",
                             GetParam().arguments) == sent.request);
    EXPECT_THAT(linesOf(tag()), IsEmpty());
}

TEST_P(ManagerOperationRow, LogsAFailureAndPassesItOn) {
    connect();
    for (int status : {STATUS_INVALID_STATE, STATUS_UNSUPPORTED, STATUS_NOT_FOUND, -1}) {
        clearLog();
        answer(status);
        EXPECT_EQ(status, GetParam().call(mClients));
        EXPECT_EQ((Lines{failure(status)}), linesOf(tag()));
    }
}

TEST_P(ManagerOperationRow, FailsWhenTheServiceIsDead) {
    connect();
    mRemote->fail(android::DEAD_OBJECT);
    EXPECT_EQ(STATUS_UNKNOWN_ERROR, GetParam().call(mClients));
    EXPECT_EQ((Lines{failure(STATUS_UNKNOWN_ERROR)}), linesOf(tag()));
}

TEST_P(ManagerOperationRow, NeedsAService) {
    clearLog();
    EXPECT_EQ(STATUS_INVALID_STATE, GetParam().call(mClients));
    EXPECT_EQ((Lines{failure(STATUS_INVALID_STATE)}), linesOf(tag()));

    connect();
    mClients.touch->deinit();
    mClients.gesture->deinit();
    mClients.hand->deinit();
    mRemote->clearTransactions();
    EXPECT_EQ(STATUS_INVALID_STATE, GetParam().call(mClients));
    EXPECT_THAT(mRemote->transactions(), IsEmpty());
}

// ---- results ----

TEST_F(ManagerOperations, BringResults) {
    connect();
    bool yes = false;
    int result = 0;
    unsigned int count = 0;
    Gesture sample = {};

    mRemote->answer(numbers({1, 0}));
    EXPECT_EQ(0, mClients.touch->isSupported(1, yes));
    EXPECT_TRUE(yes);
    mRemote->answer(numbers({0, 0}));
    EXPECT_EQ(0, mClients.touch->isEnabled(1, yes));
    EXPECT_FALSE(yes);
    mRemote->answer(numbers({3, 0}));
    EXPECT_EQ(0, mClients.gesture->addGesture(1, &sample, result));
    EXPECT_EQ(3, result);
    mRemote->answer(numbers({2, STATUS_NOT_FOUND}));
    EXPECT_EQ(STATUS_NOT_FOUND, mClients.gesture->verifyGesture(&sample, result));
    EXPECT_EQ(2, result);
    mRemote->answer(numbers({8, 0}));
    EXPECT_EQ(0, mClients.gesture->getMaxUserDefinedGesture(count));
    EXPECT_EQ(8u, count);
    mRemote->answer(numbers({9, 0}));
    EXPECT_EQ(0, mClients.gesture->getMaxPreDefinedGesture(count));
    EXPECT_EQ(9u, count);
    mRemote->answer(numbers({5, 0}));
    EXPECT_EQ(0, mClients.hand->getMaxUser(count));
    EXPECT_EQ(5u, count);
}

TEST_F(ManagerOperations, LeaveResultsAsTheyWereWithoutAService) {
    bool yes = true;
    int result = 7;
    unsigned int count = 8;
    std::vector<std::string> list = {"held"};
    mClients.touch->isEnabled(1, yes);
    mClients.gesture->addGesture(0, nullptr, result);
    mClients.hand->getMaxUser(count);
    mClients.hand->getProfileList(list);
    EXPECT_TRUE(yes);
    EXPECT_EQ(7, result);
    EXPECT_EQ(8u, count);
    EXPECT_THAT(list, ElementsAre("held"));
}

TEST_F(ManagerOperations, AppendTheProfileListToWhatTheCallerHolds) {
    connect();
    mRemote->answer([](Parcel& reply) {
        reply.writeInt32(2);
        names({"alice", "bob"})(reply);
        reply.writeInt32(0);
    });
    std::vector<std::string> list = {"held"};
    EXPECT_EQ(0, mClients.hand->getProfileList(list));
    EXPECT_THAT(list, ElementsAre("held", "alice", "bob"));
}

TEST_F(ManagerOperations, RefuseANullName) {
    connect();
    EXPECT_EQ(STATUS_NULL_POINTER, mClients.hand->renameProfile(nullptr, "B"));
    EXPECT_THAT(mRemote->transactions(), IsEmpty());
    EXPECT_EQ((Lines{"E setProfileName failed: NULL pointer"}),
              linesOf("HandBiometricManagerClient"));
}

}  // namespace
}  // namespace pemaro::test
