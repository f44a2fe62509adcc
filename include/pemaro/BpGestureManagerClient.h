// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "pemaro/Binder.h"
#include "pemaro/IGestureManagerClient.h"

namespace pemaro {

/// Proxy of IGestureManagerClient, through which the service reports to a client. Callable from
/// any thread.
class ZELK_API BpGestureManagerClient : public android::BpInterface<IGestureManagerClient> {
  public:
    /// A proxy of the object behind `remote`, which may be of any process.
    explicit BpGestureManagerClient(const android::sp<android::IBinder>& remote);

    int gestureCallback(GestureData* data) override;
};

}  // namespace pemaro
