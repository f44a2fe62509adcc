// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "pemaro/Binder.h"

#include <binder/IServiceManager.h>

#include <optional>
#include <type_traits>
#include <vector>

namespace pemaro::test {

/// \cond
// What the platform's releases have added to IServiceManager since Android 10. Each class answers an addition where
// `Manager` has it, and is nothing where it has not, which is found out at compile time.
namespace added {

template <typename Manager, typename = void>
class Waiting : public Manager {};
template <typename Manager>
class Waiting<Manager, std::void_t<decltype(&Manager::waitForService)>> : public Manager {
  public:
    android::sp<android::IBinder> waitForService(const android::String16& name) override {
        return this->checkService(name);
    }
};

template <typename Manager, typename = void>
class Declared : public Manager {};
template <typename Manager>
class Declared<Manager, std::void_t<decltype(&Manager::isDeclared)>> : public Manager {
  public:
    bool isDeclared(const android::String16& name) override {
        const android::Vector<android::String16> names =
                this->listServices(Manager::DUMP_FLAG_PRIORITY_ALL);
        for (size_t i = 0; i < names.size(); ++i) {
            if (names[i] == name) {
                return true;
            }
        }
        return false;
    }
};

template <typename Manager, typename = void>
class Instances : public Manager {};
template <typename Manager>
class Instances<Manager, std::void_t<decltype(&Manager::getDeclaredInstances)>> : public Manager {
  public:
    android::Vector<android::String16> getDeclaredInstances(const android::String16&) override {
        return {};
    }
};

template <typename Manager, typename = void>
class Updatable : public Manager {};
template <typename Manager>
class Updatable<Manager, std::void_t<decltype(&Manager::updatableViaApex)>> : public Manager {
  public:
    std::optional<android::String16> updatableViaApex(const android::String16&) override {
        return std::nullopt;
    }
};

template <typename Manager, typename = void>
class UpdatableNames : public Manager {};
template <typename Manager>
class UpdatableNames<Manager, std::void_t<decltype(&Manager::getUpdatableNames)>> : public Manager {
  public:
    android::Vector<android::String16> getUpdatableNames(const android::String16&) override {
        return {};
    }
};

template <typename Manager, typename = void>
class Connected : public Manager {};
template <typename Manager>
class Connected<Manager, std::void_t<typename Manager::ConnectionInfo>> : public Manager {
  public:
    std::optional<typename Manager::ConnectionInfo> getConnectionInfo(
            const android::String16&) override {
        return std::nullopt;
    }
};

template <typename Manager, typename = void>
class Notifying : public Manager {};
template <typename Manager>
class Notifying<Manager, std::void_t<typename Manager::LocalRegistrationCallback>>
        : public Manager {
    using Callback = typename Manager::LocalRegistrationCallback;

  public:
    android::status_t registerForNotifications(const android::String16&,
                                               const android::sp<Callback>&) override {
        return android::INVALID_OPERATION;
    }
    android::status_t unregisterForNotifications(const android::String16&,
                                                 const android::sp<Callback>&) override {
        return android::INVALID_OPERATION;
    }
};

template <typename Manager, typename = void>
class Debugged : public Manager {};
template <typename Manager>
class Debugged<Manager, std::void_t<typename Manager::ServiceDebugInfo>> : public Manager {
  public:
    std::vector<typename Manager::ServiceDebugInfo> getServiceDebugInfo() override { return {}; }
};

}  // namespace added
/// \endcond

/// A service manager of which only the four operations that every release has are yet to be made:
/// getService(), checkService(), addService() and listServices(). What the platform's releases have
/// added since Android 10 is answered: it has declared what it lists, updates nothing, is reached
/// through no network, and tells nobody of who comes.
template <typename Manager>
using EveryServiceManager = added::Waiting<added::Declared<added::Instances<added::Updatable<
        added::UpdatableNames<added::Connected<added::Notifying<added::Debugged<Manager>>>>>>>>;

}  // namespace pemaro::test
