// SPDX-License-Identifier: Apache-2.0
#include "pemaro/testkit/FakeServiceManager.h"

#include <gtest/gtest.h>

namespace pemaro::test {
namespace {

using android::BBinder;
using android::sp;

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

}  // namespace
}  // namespace pemaro::test
