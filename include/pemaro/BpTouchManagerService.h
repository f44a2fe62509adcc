// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "pemaro/Binder.h"
#include "pemaro/ITouchManagerService.h"

namespace pemaro {

/// Proxy of ITouchManagerService; see there for what each operation returns. Callable from any
/// thread.
class ZELK_API BpTouchManagerService : public android::BpInterface<ITouchManagerService> {
  public:
    /// A proxy of the object behind `remote`, which may be of any process.
    explicit BpTouchManagerService(const android::sp<android::IBinder>& remote);

    int subscribe(const android::sp<ITouchManagerClient>& client) override;
    int unsubscribe(const android::sp<ITouchManagerClient>& client) override;
    int isSupported(int feature, bool& supported) override;
    int isEnabled(int feature, bool& enabled) override;
    int enable(int feature) override;
    int disable(int feature) override;
    int configure_vm_region(android::Rect& region, bool flag) override;
};

}  // namespace pemaro
