// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "pemaro/Binder.h"
#include "pemaro/ITouchCompanionClient.h"

namespace pemaro {

/// Proxy of ITouchCompanionClient, held by the service; an identity without operations.
class ZELK_API BpTouchCompanionClient : public android::BpInterface<ITouchCompanionClient> {
  public:
    /// A proxy of the object behind `remote`, which may be of any process.
    explicit BpTouchCompanionClient(const android::sp<android::IBinder>& remote);
};

}  // namespace pemaro
