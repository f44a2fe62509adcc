// SPDX-License-Identifier: Apache-2.0
// What managers answer that override nothing, and whom they report to.

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <functional>
#include <string>
#include <vector>

#include "pemaro/BasicGestureManagerService.h"
#include "pemaro/BasicHandBiometricManagerService.h"
#include "pemaro/BasicTouchManagerService.h"
#include "tests/managers/ManagerMocks.h"

using android::sp;
using testing::NiceMock;
using testing::Return;

namespace pemaro::test {

namespace {

struct Row {
    const char* operation;
    std::function<int()> call;
};

void expectUnsupported(const std::vector<Row>& rows) {
    for (const Row& row : rows) {
        EXPECT_EQ(STATUS_UNSUPPORTED, row.call()) << row.operation;
    }
}

// A service whose reports a test can ask for.
template <typename Basic>
class Reporting : public Basic {
  public:
    using Basic::report;
};

// A proxy of its own for each subscription, around the client's binder.
template <typename Client>
sp<Client> proxyOf(const sp<Client>& client) {
    struct Proxy : android::BpInterface<Client> {
        using android::BpInterface<Client>::BpInterface;
        int gestureCallback(typename Client::GestureData*) override { return STATUS_NO_ERROR; }
    };
    return new Proxy(android::IInterface::asBinder(client));
}

}  // namespace

TEST(BasicTouchManagerService, OffersNothing) {
    const sp<BasicTouchManagerService> held = new BasicTouchManagerService;
    BasicTouchManagerService& service = *held;
    bool is = true;
    android::Rect region(0, 0, 1, 1);
    expectUnsupported({
            {"isSupported", [&] { return service.isSupported(1, is); }},
            {"enable", [&] { return service.enable(1); }},
            {"disable", [&] { return service.disable(1); }},
            {"configure_vm_region", [&] { return service.configure_vm_region(region, true); }},
    });
    EXPECT_FALSE(is);
    is = true;
    EXPECT_EQ(STATUS_UNSUPPORTED, service.isEnabled(1, is));
    EXPECT_FALSE(is);
}

TEST(BasicGestureManagerService, OffersNothing) {
    const sp<BasicGestureManagerService> held = new BasicGestureManagerService;
    BasicGestureManagerService& service = *held;
    IGestureManagerClient::GestureData* const none = nullptr;
    int added = 7;
    int verified = 7;
    unsigned int predefined = 7;
    unsigned int userDefined = 7;
    expectUnsupported({
            {"enableWakeup", [&] { return service.enableWakeup(); }},
            {"disableWakeup", [&] { return service.disableWakeup(); }},
            {"startGestureDetection", [&] { return service.startGestureDetection(); }},
            {"stopGestureDetection", [&] { return service.stopGestureDetection(); }},
            {"addGesture", [&] { return service.addGesture(0, none, added); }},
            {"deleteGesture", [&] { return service.deleteGesture(1); }},
            {"enableGesture", [&] { return service.enableGesture(1); }},
            {"disableGesture", [&] { return service.disableGesture(1); }},
            {"improveGestureTraining",
             [&] { return service.improveGestureTraining(none, verified); }},
            {"getMaxPreDefinedGesture",
             [&] { return service.getMaxPreDefinedGesture(predefined); }},
            {"getMaxUserDefinedGesture",
             [&] { return service.getMaxUserDefinedGesture(userDefined); }},
    });
    EXPECT_EQ(0, added);
    EXPECT_EQ(0, verified);
    EXPECT_EQ(0u, predefined);
    EXPECT_EQ(0u, userDefined);
}

TEST(BasicHandBiometricManagerService, OffersNothing) {
    const sp<BasicHandBiometricManagerService> held = new BasicHandBiometricManagerService;
    BasicHandBiometricManagerService& service = *held;
    unsigned int most = 7;
    std::vector<std::string> names = {"left over"};
    expectUnsupported({
            {"startEnrollment", [&] { return service.startEnrollment(); }},
            {"stopEnrollment", [&] { return service.stopEnrollment(); }},
            {"scan", [&] { return service.scan(); }},
            {"startMatching", [&] { return service.startMatching(); }},
            {"stopMatching", [&] { return service.stopMatching(); }},
            {"cancelScan", [&] { return service.cancelScan(); }},
            {"setSecurity", [&] { return service.setSecurity(1); }},
            {"setProfileName", [&] { return service.setProfileName("a"); }},
            {"deleteProfile", [&] { return service.deleteProfile("a"); }},
            {"renameProfile", [&] { return service.renameProfile("a", "b"); }},
            {"getMaxUser", [&] { return service.getMaxUser(most); }},
            {"getProfileList", [&] { return service.getProfileList(names); }},
            {"enableWakeup", [&] { return service.enableWakeup(); }},
            {"disableWakeup", [&] { return service.disableWakeup(); }},
    });
    EXPECT_EQ(0u, most);
    EXPECT_TRUE(names.empty());
}

TEST(BasicServices, ReportToTheirSubscribers) {
    const sp<Reporting<BasicTouchManagerService>> touch = new Reporting<BasicTouchManagerService>;
    const sp<Reporting<BasicGestureManagerService>> gestures =
            new Reporting<BasicGestureManagerService>;
    const sp<Reporting<BasicHandBiometricManagerService>> hands =
            new Reporting<BasicHandBiometricManagerService>;
    const sp<MockTouchManagerClient> toucher = new MockTouchManagerClient;
    const sp<MockGestureManagerClient> drawer = new MockGestureManagerClient;
    const sp<MockHandBiometricManagerClient> hand = new MockHandBiometricManagerClient;
    EXPECT_EQ(STATUS_NO_ERROR, touch->subscribe(toucher));
    EXPECT_EQ(STATUS_NO_ERROR, gestures->subscribe(drawer));
    EXPECT_EQ(STATUS_NO_ERROR, hands->subscribe(hand));

    static ITouchManagerClient::GestureData touched;
    static IGestureManagerClient::GestureData drawn;
    static IHandBiometricManagerClient::HandBioData shown;
    EXPECT_CALL(*toucher, gestureCallback(&touched)).WillOnce(Return(0));
    EXPECT_CALL(*drawer, gestureCallback(&drawn)).WillOnce(Return(0));
    EXPECT_CALL(*hand, handBiometricCallback(&shown)).WillOnce(Return(0));
    touch->report(touched);
    gestures->report(drawn);
    hands->report(shown);

    EXPECT_EQ(STATUS_NO_ERROR, touch->unsubscribe(toucher));
    EXPECT_EQ(STATUS_NO_ERROR, gestures->unsubscribe(drawer));
    EXPECT_EQ(STATUS_NO_ERROR, hands->unsubscribe(hand));
    touch->report(touched);
    gestures->report(drawn);
    hands->report(shown);
}

TEST(Subscribers, KnowAClientByItsBinder) {
    Subscribers<IGestureManagerClient> subscribers;
    const sp<IGestureManagerClient> client = new NiceMock<MockGestureManagerClient>;
    const sp<IGestureManagerClient> other = new NiceMock<MockGestureManagerClient>;
    EXPECT_EQ(STATUS_BAD_PARAMETER, subscribers.add(nullptr));
    EXPECT_EQ(STATUS_NO_ERROR, subscribers.add(proxyOf(client)));
    EXPECT_EQ(STATUS_NO_ERROR, subscribers.add(proxyOf(client)));
    EXPECT_EQ(1u, subscribers.size());
    EXPECT_EQ(STATUS_NOT_FOUND, subscribers.remove(other));
    EXPECT_EQ(STATUS_NO_ERROR, subscribers.remove(proxyOf(client)));
    EXPECT_EQ(STATUS_NOT_FOUND, subscribers.remove(client));
    EXPECT_EQ(0u, subscribers.size());
}

TEST(Subscribers, LetGoOfWhoCannotBeReached) {
    Subscribers<IGestureManagerClient> subscribers;
    const sp<IGestureManagerClient> dead = new NiceMock<MockGestureManagerClient>;
    const sp<IGestureManagerClient> cross = new NiceMock<MockGestureManagerClient>;
    subscribers.add(dead);
    subscribers.add(cross);
    int calls = 0;
    const auto report = [&](IGestureManagerClient& client) {
        ++calls;
        // No lock is held: a client may unsubscribe, or subscribe once more, from within.
        EXPECT_EQ(STATUS_NO_ERROR, subscribers.add(cross));
        return &client == dead.get() ? STATUS_UNKNOWN_ERROR : STATUS_UNSUPPORTED;
    };
    subscribers.report(report);
    EXPECT_EQ(2, calls);
    EXPECT_EQ(1u, subscribers.size());
    subscribers.report(report);
    EXPECT_EQ(3, calls);
}

}  // namespace pemaro::test
