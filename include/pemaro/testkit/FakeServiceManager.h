// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "pemaro/Binder.h"

#include <functional>
#include <map>
#include <mutex>
#include <string>

#include "pemaro/testkit/ServiceManagerShims.h"

namespace pemaro::test {

/// A service manager of the test's own: names and binders, and a count of the lookups.
///
///     ScopedServiceManager services;            // what android::defaultServiceManager() returns
///     now services->add("pemaro.TouchService", binder);
///     ...
///     EXPECT_EQ(1, services->lookups("pemaro.TouchService"));
///
/// Lookups never wait: an absent service yields null at once.
class FakeServiceManager : public EveryServiceManager<android::IServiceManager> {
  public:
    /// Called before each lookup with the name and its number, counted from 1 for each name.
    using LookupHook = std::function<void(const std::string& name, int attempt)>;

    /// What a test does with it; `lookups` is how often a name was looked up.
    void add(const std::string& name, const android::sp<android::IBinder>& service);
    void remove(const std::string& name);
    int lookups(const std::string& name) const;

    /// A hook may add or remove services, so that one appears at the n-th attempt.
    void onLookup(LookupHook hook);

    /// What the library and the platform ask it.
    android::sp<android::IBinder> getService(const android::String16& name) const override;
    android::sp<android::IBinder> checkService(const android::String16& name) const override;
    android::status_t addService(const android::String16& name,
                                 const android::sp<android::IBinder>& service, bool allowIsolated,
                                 int dumpsysFlags) override;
    android::Vector<android::String16> listServices(int dumpsysFlags) override;

  private:
    android::IBinder* onAsBinder() override { return nullptr; }
    android::sp<android::IBinder> find(const android::String16& name) const;

    mutable std::mutex mLock;
    LookupHook mHook;
    std::map<std::string, android::sp<android::IBinder>> mServices;
    mutable std::map<std::string, int> mLookups;
};

/// While one lives its manager is the process's default service manager; without one there is none,
/// and android::defaultServiceManager() returns null. Binder is made to work in this process alone
/// (NativeBinder.h).
class ScopedServiceManager {
  public:
    /// The manager takes its place, and leaves it.
    ScopedServiceManager();
    ~ScopedServiceManager();
    ScopedServiceManager(const ScopedServiceManager&) = delete;
    ScopedServiceManager& operator=(const ScopedServiceManager&) = delete;

    /// The manager.
    FakeServiceManager* operator->() const { return mManager.get(); }

  private:
    android::sp<FakeServiceManager> mManager;
};

}  // namespace pemaro::test
