// SPDX-License-Identifier: Apache-2.0
#include "managers/ManagerConnection.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <functional>

#include "pemaro/testkit/FakeServiceManager.h"
#include "tests/support/LogLines.h"
#include "tests/support/RecordingBinder.h"

namespace pemaro::test {
namespace {

using android::IBinder;
using android::sp;
using ::testing::ElementsAre;
using ::testing::IsEmpty;

struct Client : public virtual android::RefBase {};

// A service whose cast refuses every binder, which the platform's own casts never do.
class OtherService : public android::RefBase {
  public:
    static sp<OtherService> asInterface(const sp<IBinder>&) { return nullptr; }

    int subscribe(const sp<Client>&) { return ++calls; }
    int unsubscribe(const sp<Client>&) { return ++calls; }

    int calls = 0;
};

constexpr ManagerTexts kTexts = {"Tag", "service", "connected", "link failed"};

TEST(ManagerConnection, RefusesABinderOfAnotherInterface) {
    ScopedServiceManager services;
    const sp<RecordingBinder> binder = new RecordingBinder;
    services->add("service", binder);
    const sp<Client> self = new Client;
    const sp<OtherService> held = new OtherService;
    sp<OtherService> service = held;
    bool initialized = false;
    ManagerConnection connection(kTexts, initialized, service, self.get());

    clearLog();
    EXPECT_EQ(STATUS_BAD_PARAMETER, connection.initWatched(nullptr));
    EXPECT_EQ((Lines{"D init: E", "E wrong service interface?"}), linesOf("Tag"));
    EXPECT_FALSE(initialized);
    // What was held before is let go, without a call.
    EXPECT_EQ(nullptr, service);
    EXPECT_EQ(0, held->calls);
    EXPECT_EQ(0, binder->linkCalls());

    // The step alone, of which the touch manager client makes its init().
    clearLog();
    EXPECT_EQ(nullptr, connection.hold(binder));
    EXPECT_EQ((Lines{"E wrong service interface?"}), linesOf("Tag"));
}

// One that does something else while it is asked.
class BusyService : public android::IInterface {
  public:
    static sp<BusyService> asInterface(const sp<IBinder>&) { return instance; }

    int subscribe(const sp<Client>&) {
        ++subscribed;
        onSubscribe();
        return STATUS_NO_ERROR;
    }
    int unsubscribe(const sp<Client>&) {
        ++unsubscribed;
        return STATUS_NO_ERROR;
    }

    static sp<BusyService> instance;
    std::function<void()> onSubscribe = [] {};
    int subscribed = 0;
    int unsubscribed = 0;

  private:
    IBinder* onAsBinder() override { return mBinder.get(); }

    const sp<RecordingBinder> mBinder = new RecordingBinder;
};

sp<BusyService> BusyService::instance;

// Whoever is subscribed is reached by the next deinit(), whatever ran beside the init().
TEST(ManagerConnection, CanBeEndedAfterADeinitWithinAnInit) {
    ScopedServiceManager services;
    services->add("service", new RecordingBinder);
    const sp<Client> self = new Client;
    BusyService::instance = new BusyService;
    BusyService& busy = *BusyService::instance;
    sp<BusyService> service;
    bool initialized = false;
    ManagerConnection connection(kTexts, initialized, service, self.get());
    ASSERT_EQ(STATUS_NO_ERROR, connection.initWatched(nullptr));
    busy.onSubscribe = [&] { EXPECT_EQ(STATUS_NO_ERROR, connection.deinit(nullptr)); };
    EXPECT_EQ(STATUS_NO_ERROR, connection.initWatched(nullptr));
    EXPECT_TRUE(initialized);
    EXPECT_EQ(BusyService::instance, service);
    EXPECT_EQ(1, busy.unsubscribed);

    EXPECT_EQ(STATUS_NO_ERROR, connection.deinit(nullptr));
    EXPECT_EQ(2, busy.unsubscribed);
    EXPECT_FALSE(initialized);
    EXPECT_EQ(nullptr, service);
    BusyService::instance.clear();
}

}  // namespace
}  // namespace pemaro::test
