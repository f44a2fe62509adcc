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

    /// Waits for the service called `name`; for ever without a `patience`, no longer once the
    /// command has to stop or `giveUp` returns true. What takes long is told on stderr. Null when
    /// it did not appear.
    static std::unique_ptr<ServiceWatch> await(const char* name,
                                               std::optional<std::chrono::seconds> patience,
                                               const std::function<bool()>& giveUp = nullptr);

    /// The same at once, and in silence.
    static std::unique_ptr<ServiceWatch> find(const char* name);

    ~ServiceWatch();

    bool died() const;

    const android::sp<android::IBinder>& binder() const { return mService; }

  private:
    class DeathNotice;

    ServiceWatch(const android::sp<android::IBinder>& service,
                 const android::sp<DeathNotice>& notice);

    const android::sp<android::IBinder> mService;
    const android::sp<DeathNotice> mNotice;
};

/// Tells that the service did not appear, or that the command was stopped before; the exit status.
int failMissing(const char* name);

/// kExitSuccess once Binder's threads run, or kExitAbsent when this process cannot use Binder; the
/// user has been told why.
int startBinder();

}  // namespace pemaro::zelkctl
