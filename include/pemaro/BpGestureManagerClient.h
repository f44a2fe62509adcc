// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "pemaro/Binder.h"
#include "pemaro/IGestureManagerClient.h"

namespace pemaro {

/// Proxy of IGestureManagerClient, through which the service reports to a client. Callable from
/// any thread.
class ZELK_API BpGestureManagerClient : public android::BpInterface<IGestureManagerClient> {
  public:
    explicit BpGestureManagerClient(const android::sp<android::IBinder>& remote);

    int gestureCallback(GestureData* data) override;
};

}  // namespace pemaro
