// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "pemaro/Binder.h"
#include "pemaro/IGestureManagerService.h"

namespace pemaro {

/// Stub of IGestureManagerService, from which a service derives.
///
/// It unpacks each request, calls the operation and packs the answer; a service implements the
/// operations and nothing of the transport.
class ZELK_API BnGestureManagerService : public android::BnInterface<IGestureManagerService> {
  public:
    /// Called by Binder on one of its threads. A request without the interface token is answered
    /// with -1 (PERMISSION_DENIED) and an untouched reply, before its code is looked at; a code
    /// of no operation goes to BBinder. Otherwise the result is 0, whatever the operation returns.
    android::status_t onTransact(uint32_t code, const android::Parcel& data, android::Parcel* reply,
                                 uint32_t flags = 0) override;
};

}  // namespace pemaro
