// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <ui/Rect.h>

#include "pemaro/Binder.h"
#include "pemaro/Export.h"
#include "pemaro/ITouchManagerClient.h"

namespace pemaro {

/// The Binder interface of the touch manager: gesture events and gesture features.
///
/// The service is registered with the service manager as "pemaro.TouchManagerService", which is the
/// descriptor too. Every call is one synchronous transaction on the caller's thread and returns a
/// status: 0, or the service's own status, unchanged. Through a proxy it is 0x40000000 when the
/// transaction failed, whatever the reason, which is logged under the tag "ITouchManagerService";
/// no result is then stored.
///
/// A feature is a number whose meaning the service defines. The operations stand in the order of
/// their virtual slots, which callers are compiled against.
class ZELK_API ITouchManagerService : public android::IInterface {
  public:
    DECLARE_META_INTERFACE(TouchManagerService)

    /// Reports every further gesture to `client`, which the service keeps a reference to.
    virtual int subscribe(const android::sp<ITouchManagerClient>& client) = 0;

    /// Ends the reports to `client`.
    virtual int unsubscribe(const android::sp<ITouchManagerClient>& client) = 0;

    /// Whether the device has the feature. An implementation sets `supported` whatever it returns.
    virtual int isSupported(int feature, bool& supported) = 0;

    /// Whether the feature is switched on. An implementation sets `enabled` whatever it returns.
    virtual int isEnabled(int feature, bool& enabled) = 0;

    /// Switches the feature on.
    virtual int enable(int feature) = 0;

    /// Switches the feature off.
    virtual int disable(int feature) = 0;

    /// Configures a region of the screen; the service defines what `flag` switches.
    virtual int configure_vm_region(android::Rect& region, bool flag) = 0;
};

}  // namespace pemaro
