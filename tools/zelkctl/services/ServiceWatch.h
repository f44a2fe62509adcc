// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "pemaro/Binder.h"

#include <chrono>
#include <functional>
#include <memory>
#include <optional>

namespace pemaro::zelkctl {

/// A service that is there and alive, found with zelkctl's own patience instead of the platform's,
/// which is not to be interrupted.
/// A manager's client that is initialised afterwards finds it at its first attempt.
class ServiceWatch {
  public:
    /// How long a command waits for a service that is not there, as the clients do.
    static constexpr std::chrono::seconds kPatience{5};

    /// Waits for the service called `name`; for ever without a `patience`, and no longer once
    /// `giveUp` returns true. What takes long is told on stderr. Null when it did not appear.
    static std::unique_ptr<ServiceWatch> await(const char* name,
                                               std::optional<std::chrono::seconds> patience,
                                               const std::function<bool()>& giveUp);

    ~ServiceWatch();

    bool died() const;

  private:
    class DeathNotice;

    ServiceWatch(const android::sp<android::IBinder>& service,
                 const android::sp<DeathNotice>& notice);

    static std::unique_ptr<ServiceWatch> find(const char* name);

    const android::sp<android::IBinder> mService;
    const android::sp<DeathNotice> mNotice;
};

/// False, and the user has been told why, when this process cannot use Binder.
/// Starts its threads otherwise.
bool startBinder();

}  // namespace pemaro::zelkctl
