// SPDX-License-Identifier: Apache-2.0
#include "pemaro/testkit/FakeServiceManager.h"

#include <gtest/gtest.h>

namespace pemaro::test {
namespace {

using android::BBinder;
using android::IBinder;
using android::sp;
using android::String16;
using android::Vector;

// Looks up who is there when it is destroyed.
class Farewell : public BBinder {
  public:
    Farewell(FakeServiceManager& services, int& lookups) : mServices(services), mLookups(lookups) {}
    ~Farewell() override { mLookups = mServices.lookups("service"); }

  private:
    FakeServiceManager& mServices;
    int& mLookups;
};

TEST(FakeServiceManager, HoldsNoLockWhenAServiceIsDestroyed) {
    ScopedServiceManager services;
    const android::String16 name("service");
    for (const bool replaced : {true, false}) {
        int lookups = -1;
        services->add("service", new Farewell(*services.operator->(), lookups));
        EXPECT_NE(nullptr, android::defaultServiceManager()->checkService(name));
        if (replaced) {
            services->add("service", new BBinder);
        } else {
            services->remove("service");
        }
        EXPECT_LT(0, lookups);
        EXPECT_EQ(replaced, android::defaultServiceManager()->checkService(name) != nullptr);
    }
}

TEST(FakeServiceManager, HasNothingToRemoveTwice) {
    ScopedServiceManager services;
    services->add("service", new BBinder);
    services->remove("service");
    services->remove("service");
    EXPECT_EQ(nullptr,
              android::defaultServiceManager()->checkService(android::String16("service")));
}

// IServiceManager as the releases declare it.
struct Android10Manager : android::RefBase {
    static constexpr int DUMP_FLAG_PRIORITY_ALL = 15;

    virtual sp<IBinder> checkService(const String16& name) const = 0;
    virtual Vector<String16> listServices(int flags) = 0;
};

struct Android14Manager : Android10Manager {
    struct ConnectionInfo {};
    struct LocalRegistrationCallback : android::RefBase {};
    struct ServiceDebugInfo {};

    virtual sp<IBinder> waitForService(const String16& name) = 0;
    virtual bool isDeclared(const String16& name) = 0;
    virtual Vector<String16> getDeclaredInstances(const String16& interface) = 0;
    virtual std::optional<String16> updatableViaApex(const String16& name) = 0;
    virtual Vector<String16> getUpdatableNames(const String16& apexName) = 0;
    virtual std::optional<ConnectionInfo> getConnectionInfo(const String16& name) = 0;
    virtual android::status_t registerForNotifications(
            const String16& name, const sp<LocalRegistrationCallback>& callback) = 0;
    virtual android::status_t unregisterForNotifications(
            const String16& name, const sp<LocalRegistrationCallback>& callback) = 0;
    virtual std::vector<ServiceDebugInfo> getServiceDebugInfo() = 0;
};

// Of one service.
template <typename Release>
struct OneService : EveryServiceManager<Release> {
    sp<IBinder> checkService(const String16& name) const override {
        return name == String16("service") ? service : nullptr;
    }
    Vector<String16> listServices(int) override {
        Vector<String16> names;
        names.push(String16("service"));
        return names;
    }
    sp<IBinder> service = new BBinder;
};

TEST(EveryServiceManager, IsThatOfAndroid10) {
    const sp<OneService<Android10Manager>> manager = new OneService<Android10Manager>;
    EXPECT_EQ(manager->service, manager->checkService(String16("service")));
}

TEST(EveryServiceManager, AnswersWhatLaterReleasesAsk) {
    const sp<OneService<Android14Manager>> manager = new OneService<Android14Manager>;
    const String16 name("service");
    const String16 none("none");
    EXPECT_EQ(manager->service, manager->waitForService(name));
    EXPECT_EQ(nullptr, manager->waitForService(none));
    EXPECT_TRUE(manager->isDeclared(name));
    EXPECT_FALSE(manager->isDeclared(none));
    EXPECT_EQ(0u, manager->getDeclaredInstances(name).size());
    EXPECT_FALSE(manager->updatableViaApex(name).has_value());
    EXPECT_EQ(0u, manager->getUpdatableNames(name).size());
    EXPECT_FALSE(manager->getConnectionInfo(name).has_value());
    EXPECT_EQ(android::INVALID_OPERATION, manager->registerForNotifications(name, nullptr));
    EXPECT_EQ(android::INVALID_OPERATION, manager->unregisterForNotifications(name, nullptr));
    EXPECT_TRUE(manager->getServiceDebugInfo().empty());
}

}  // namespace
}  // namespace pemaro::test
