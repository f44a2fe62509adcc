// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "pemaro/Binder.h"
#include "pemaro/ITouchManagerClient.h"

namespace pemaro {

/// Proxy of ITouchManagerClient, through which the service reports to a client. Callable from
/// any thread.
class ZELK_API BpTouchManagerClient : public android::BpInterface<ITouchManagerClient> {
  public:
    /// A proxy of the object behind `remote`, which may be of any process.
    explicit BpTouchManagerClient(const android::sp<android::IBinder>& remote);

    int gestureCallback(GestureData* data) override;
};

}  // namespace pemaro
