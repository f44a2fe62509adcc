// SPDX-License-Identifier: Apache-2.0
// What managers answer that override nothing, and whom they report to.

#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "pemaro/BasicGestureManagerService.h"
#include "pemaro/BasicHandBiometricManagerService.h"
#include "pemaro/BasicTouchManagerService.h"
#include "tests/managers/RecordingManagers.h"

using android::sp;

namespace pemaro::test {

namespace {

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
    const sp<BasicTouchManagerService> service = new BasicTouchManagerService;
    bool is = true;
    android::Rect region(0, 0, 1, 1);
    EXPECT_EQ(STATUS_UNSUPPORTED, service->isSupported(1, is));
    EXPECT_EQ(STATUS_UNSUPPORTED, service->enable(1));
    EXPECT_EQ(STATUS_UNSUPPORTED, service->disable(1));
    EXPECT_EQ(STATUS_UNSUPPORTED, service->configure_vm_region(region, true));
    EXPECT_FALSE(is);
    is = true;
    EXPECT_EQ(STATUS_UNSUPPORTED, service->isEnabled(1, is));
    EXPECT_FALSE(is);
}

TEST(BasicGestureManagerService, OffersNothing) {
    const sp<BasicGestureManagerService> service = new BasicGestureManagerService;
    IGestureManagerClient::GestureData* const none = nullptr;
    int added = 7;
    int verified = 7;
    unsigned int predefined = 7;
    unsigned int userDefined = 7;
    EXPECT_EQ(STATUS_UNSUPPORTED, service->enableWakeup());
    EXPECT_EQ(STATUS_UNSUPPORTED, service->disableWakeup());
    EXPECT_EQ(STATUS_UNSUPPORTED, service->startGestureDetection());
    EXPECT_EQ(STATUS_UNSUPPORTED, service->stopGestureDetection());
    EXPECT_EQ(STATUS_UNSUPPORTED, service->addGesture(0, none, added));
    EXPECT_EQ(STATUS_UNSUPPORTED, service->deleteGesture(1));
    EXPECT_EQ(STATUS_UNSUPPORTED, service->enableGesture(1));
    EXPECT_EQ(STATUS_UNSUPPORTED, service->disableGesture(1));
    EXPECT_EQ(STATUS_UNSUPPORTED, service->improveGestureTraining(none, verified));
    EXPECT_EQ(STATUS_UNSUPPORTED, service->getMaxPreDefinedGesture(predefined));
    EXPECT_EQ(STATUS_UNSUPPORTED, service->getMaxUserDefinedGesture(userDefined));
    EXPECT_EQ(0, added);
    EXPECT_EQ(0, verified);
    EXPECT_EQ(0u, predefined);
    EXPECT_EQ(0u, userDefined);
}

TEST(BasicHandBiometricManagerService, OffersNothing) {
    const sp<BasicHandBiometricManagerService> service = new BasicHandBiometricManagerService;
    unsigned int most = 7;
    const std::vector<std::string> held = {"of the caller"};
    std::vector<std::string> names = held;
    EXPECT_EQ(STATUS_UNSUPPORTED, service->startEnrollment());
    EXPECT_EQ(STATUS_UNSUPPORTED, service->stopEnrollment());
    EXPECT_EQ(STATUS_UNSUPPORTED, service->scan());
    EXPECT_EQ(STATUS_UNSUPPORTED, service->startMatching());
    EXPECT_EQ(STATUS_UNSUPPORTED, service->stopMatching());
    EXPECT_EQ(STATUS_UNSUPPORTED, service->cancelScan());
    EXPECT_EQ(STATUS_UNSUPPORTED, service->setSecurity(1));
    EXPECT_EQ(STATUS_UNSUPPORTED, service->setProfileName("a"));
    EXPECT_EQ(STATUS_UNSUPPORTED, service->deleteProfile("a"));
    EXPECT_EQ(STATUS_UNSUPPORTED, service->renameProfile("a", "b"));
    EXPECT_EQ(STATUS_UNSUPPORTED, service->getMaxUser(most));
    EXPECT_EQ(STATUS_UNSUPPORTED, service->getProfileList(names));
    EXPECT_EQ(STATUS_UNSUPPORTED, service->enableWakeup());
    EXPECT_EQ(STATUS_UNSUPPORTED, service->disableWakeup());
    EXPECT_EQ(0u, most);
    EXPECT_EQ(held, names) << "names are appended";
}

TEST(BasicServices, ReportToTheirSubscribers) {
    const sp<Reporting<BasicTouchManagerService>> touch = new Reporting<BasicTouchManagerService>;
    const sp<Reporting<BasicGestureManagerService>> gestures =
            new Reporting<BasicGestureManagerService>;
    const sp<Reporting<BasicHandBiometricManagerService>> hands =
            new Reporting<BasicHandBiometricManagerService>;
    const sp<RecordingTouchManagerClient> toucher = new RecordingTouchManagerClient;
    const sp<RecordingGestureManagerClient> drawer = new RecordingGestureManagerClient;
    const sp<RecordingHandBiometricManagerClient> hand = new RecordingHandBiometricManagerClient;
    EXPECT_EQ(STATUS_NO_ERROR, touch->subscribe(toucher));
    EXPECT_EQ(STATUS_NO_ERROR, gestures->subscribe(drawer));
    EXPECT_EQ(STATUS_NO_ERROR, hands->subscribe(hand));

    static ITouchManagerClient::GestureData touched;
    static IGestureManagerClient::GestureData drawn;
    static IHandBiometricManagerClient::HandBioData shown;
    touch->report(touched);
    gestures->report(drawn);
    hands->report(shown);

    EXPECT_EQ(STATUS_NO_ERROR, touch->unsubscribe(toucher));
    EXPECT_EQ(STATUS_NO_ERROR, gestures->unsubscribe(drawer));
    EXPECT_EQ(STATUS_NO_ERROR, hands->unsubscribe(hand));
    touch->report(touched);
    gestures->report(drawn);
    hands->report(shown);

    // Once each, while they were subscribed.
    EXPECT_EQ(Recording::Addresses{&touched}, toucher->addresses);
    EXPECT_EQ(Recording::Addresses{&drawn}, drawer->addresses);
    EXPECT_EQ(Recording::Addresses{&shown}, hand->addresses);
}

TEST(Subscribers, KnowAClientByItsBinder) {
    Subscribers<IGestureManagerClient> subscribers;
    const sp<IGestureManagerClient> client = new RecordingGestureManagerClient;
    const sp<IGestureManagerClient> other = new RecordingGestureManagerClient;
    EXPECT_EQ(STATUS_BAD_PARAMETER, subscribers.add(nullptr));
    EXPECT_EQ(STATUS_NO_ERROR, subscribers.add(proxyOf(client)));
    EXPECT_EQ(STATUS_NO_ERROR, subscribers.add(proxyOf(client)));
    EXPECT_EQ(1u, subscribers.size());
    EXPECT_EQ(STATUS_NOT_FOUND, subscribers.remove(other));
    EXPECT_EQ(STATUS_NO_ERROR, subscribers.remove(proxyOf(client)));
    EXPECT_EQ(STATUS_NOT_FOUND, subscribers.remove(client));
    EXPECT_EQ(0u, subscribers.size());
}

// A client whose process may be no more.
struct RemoteGestureManagerClient : RecordingGestureManagerClient {
    bool isBinderAlive() const override { return isAlive; }
    bool isAlive = true;
};

TEST(Subscribers, LetGoOfWhoIsNoMore) {
    Subscribers<IGestureManagerClient> subscribers;
    const sp<RemoteGestureManagerClient> dead = new RemoteGestureManagerClient;
    const sp<IGestureManagerClient> cross = new RecordingGestureManagerClient;
    dead->isAlive = false;
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

TEST(Subscribers, KeepWhoMissedAReport) {
    Subscribers<IGestureManagerClient> subscribers;
    const sp<IGestureManagerClient> busy = new RemoteGestureManagerClient;
    subscribers.add(busy);
    subscribers.report([](IGestureManagerClient&) { return STATUS_UNKNOWN_ERROR; });
    EXPECT_EQ(1u, subscribers.size());
}

}  // namespace pemaro::test
