// SPDX-License-Identifier: Apache-2.0
// Operations, events, death notices, init() and deinit() of one client at once. What is tested is
// that nothing is used after it was let go: by the sanitizers, and by the counts at the end.

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <string>

#include "pemaro/GestureManagerClient.h"
#include "pemaro/HandBiometricManagerClient.h"
#include "pemaro/Status.h"
#include "pemaro/TouchManagerClient.h"
#include "pemaro/testkit/FakeServiceManager.h"
#include "tests/support/FakeWaits.h"
#include "tests/support/LogLines.h"
#include "tests/support/RecordingBinder.h"
#include "tests/support/RunAtOnce.h"

namespace pemaro::test {
namespace {

using android::sp;

constexpr int kRounds = 300;

void ignoreTouchGesture(ITouchManagerClient::GestureData*, void*) {}
void ignoreGesture(IGestureManagerClient::GestureData*, void*) {}
void ignoreHandEvent(IHandBiometricManagerClient::HandBioData*, void*) {}
void ignoreDeath(void*) {}

struct TouchManagerCase {
    using Client = TouchManagerClient;
    static constexpr char kService[] = "pemaro.TouchManagerService";
    // The class's callback and context are the latest client's, whoever has an event meanwhile.
    static sp<Client> make(void* context) { return new Client(ignoreTouchGesture, context); }
    static void operate(Client& client) {
        bool supported = false;
        client.isSupported(1, supported);
    }
    static void event(Client& client) { client.gestureCallback(nullptr); }
    static void die(Client&) { make(&gOther); }
    static int gOther;
};
int TouchManagerCase::gOther = 0;

struct GestureManagerCase {
    using Client = GestureManagerClient;
    static constexpr char kService[] = "pemaro.GestureManagerService";
    static sp<Client> make(void* context) {
        return new Client(ignoreGesture, ignoreDeath, context);
    }
    static void operate(Client& client) { client.enableGesture(1); }
    static void event(Client& client) { client.gestureCallback(nullptr); }
    static void die(Client& client) { client.binderDied(nullptr); }
};

struct HandManagerCase {
    using Client = HandBiometricManagerClient;
    static constexpr char kService[] = "pemaro.HandBiometricManagerService";
    static sp<Client> make(void* context) {
        return new Client(ignoreHandEvent, ignoreDeath, context);
    }
    static void operate(Client& client) { client.scan(); }
    static void event(Client& client) { client.handBiometricCallback(nullptr); }
    static void die(Client& client) { client.binderDied(nullptr); }
};

template <typename Case>
class ManagerClientAtOnce : public ::testing::Test {
  protected:
    ManagerClientAtOnce() {
        mServices->add(Case::kService, mRemote);
        clearLog();
    }

    // With a null context every event makes the client unsubscribe, from Binder's thread.
    void runWith(void* context) {
        const sp<typename Case::Client> client = Case::make(context);
        runAtOnce(kRounds, {
                                   [&] { client->init(); },
                                   [&] { client->deinit(); },
                                   [&] { Case::operate(*client); },
                                   [&] { Case::operate(*client); },
                                   [&] { Case::event(*client); },
                                   [&] {
                                       Case::die(*client);
                                       clearLog();
                                       mRemote->clearTransactions();
                                   },
                           });
        client->init();
        client->deinit();
        clearLog();
        Case::operate(*client);
        EXPECT_EQ(1u, linesOf(tag()).size()) << "no service is held";
    }

    static std::string tag() {
        const std::string service = Case::kService;  // "pemaro.XService" belongs to "XClient"
        return service.substr(7, service.size() - 7 - 7) + "Client";
    }

    // The service manager's reference and the test's.
    void TearDown() override { EXPECT_EQ(2, mRemote->getStrongCount()); }

    ScopedServiceManager mServices;
    FakeWaits mWaits;
    const sp<RecordingBinder> mRemote = new RecordingBinder;
};

using Cases = ::testing::Types<TouchManagerCase, GestureManagerCase, HandManagerCase>;
TYPED_TEST_SUITE(ManagerClientAtOnce, Cases);

TYPED_TEST(ManagerClientAtOnce, UsesNothingThatWasLetGo) {
    int context = 0;
    this->runWith(&context);
}

TYPED_TEST(ManagerClientAtOnce, UsesNothingThatWasLetGoWithoutAContext) {
    this->runWith(nullptr);
}

}  // namespace
}  // namespace pemaro::test
