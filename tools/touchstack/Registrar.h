// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "pemaro/Binder.h"

#include <functional>
#include <string>
#include <utility>
#include <vector>

namespace pemaro::touchstack {

/// Keeps services registered. On a desk the service manager is a program like any other: it ends, and
/// another one starts and knows nothing. The platform's own proxy for it stays dead for the life of
/// the process, so the few transactions that are needed are made here.
class Registrar {
  public:
    using Services = std::vector<std::pair<std::string, android::sp<android::IBinder>>>;

    /// `services` are registered already; `tell` hears a line about what changes.
    Registrar(Services services, std::function<void(const std::string&)> tell);

    /// Looks after the service manager; to be called now and then, by one thread.
    void check();

  private:
    const Services mServices;
    const std::function<void(const std::string&)> mTell;
    bool mManagerThere = true;
};

}  // namespace pemaro::touchstack
