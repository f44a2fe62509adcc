// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "pemaro/Binder.h"

#include <memory>

#include "pemaro/ITouchCompanionFacade.h"
#include "pemaro/TouchCompanionClient.h"
#include "tools/zelkctl/services/ServiceWatch.h"

namespace pemaro::zelkctl {

/// The way to the touch service: that it is there and alive, found out at once and not after the
/// platform's own patience, and the clients that talk to it. The functions that return a pointer
/// have told the user what is wrong when it is null.
class Connection {
  public:
    static std::unique_ptr<Connection> open();

    /// Whether the service's process ended since open().
    bool serviceDied() const { return mService->died(); }

    /// An initialised facade from the exported factory, as a program outside the tree gets it.
    static std::unique_ptr<ITouchCompanionFacade> openFacade(
            TouchCompanionClient::DataCallback callback = nullptr, void* context = nullptr);

    /// An initialised client, for what the facade lacks.
    static android::sp<TouchCompanionClient> openClient();

  private:
    explicit Connection(std::unique_ptr<ServiceWatch> service);

    const std::unique_ptr<ServiceWatch> mService;
};

}  // namespace pemaro::zelkctl
