// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "pemaro/Binder.h"

#include <memory>

#include "pemaro/ITouchCompanionFacade.h"
#include "pemaro/ITouchCompanionService.h"
#include "pemaro/TouchCompanionClient.h"
#include "tools/zelkctl/services/ServiceWatch.h"

namespace pemaro::zelkctl {

/// The way to the touch service: that it is there and alive, found out at once and not after the
/// platform's own patience, and the clients that talk to it. When one of the functions that take an
/// exit status returns null, the user has been told why, and the status is set.
class Connection {
  public:
    static constexpr const char* kService = "pemaro.TouchService";

    static std::unique_ptr<Connection> open(int& exitStatus);

    /// Whether the service's process ended since open().
    bool serviceDied() const { return mService->died(); }

    /// The interface itself, for what the clients lack.
    android::sp<ITouchCompanionService> service() const;

    /// An initialised facade from the exported factory, as a program outside the tree gets it.
    static std::unique_ptr<ITouchCompanionFacade> openFacade(
            int& exitStatus, TouchCompanionClient::DataCallback callback = nullptr,
            void* context = nullptr);

    /// An initialised client, for what the facade lacks.
    static android::sp<TouchCompanionClient> openClient(int& exitStatus);

  private:
    explicit Connection(std::unique_ptr<ServiceWatch> service);

    const std::unique_ptr<ServiceWatch> mService;
};

}  // namespace pemaro::zelkctl
