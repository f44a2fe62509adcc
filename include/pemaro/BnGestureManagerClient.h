// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "pemaro/Binder.h"
#include "pemaro/IGestureManagerClient.h"

namespace pemaro {

/// Stub of IGestureManagerClient: the side that lives in the client's process.
class ZELK_API BnGestureManagerClient : public android::BnInterface<IGestureManagerClient> {
  public:
    /// Called by Binder on one of its threads. A request without the interface token is answered
    /// with -1 (PERMISSION_DENIED) and an untouched reply, before its code is looked at; a code
    /// other than 1 goes to BBinder. Otherwise the result is 0, whatever the callback returns.
    android::status_t onTransact(uint32_t code, const android::Parcel& data, android::Parcel* reply,
                                 uint32_t flags = 0) override;
};

}  // namespace pemaro
