// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstdint>

#include "pemaro/Binder.h"
#include "pemaro/Export.h"

namespace pemaro {

/// The callback interface that a client registers with the gesture manager, which calls it for
/// every gesture that it detects.
///
/// Descriptor and log tag: "pemaro.GestureManagerClient", "IGestureManagerClient". A proxy returns
/// 0x40000000 when the transaction failed (logged), else the client's status, unchanged.
class ZELK_API IGestureManagerClient : public android::IInterface {
  public:
    DECLARE_META_INTERFACE(GestureManagerClient)

    /// One gesture, detected, recorded as a sample or drawn to be verified: 72,144 bytes whose
    /// layout belongs to the service and the application. They cross Binder as they are, byte for
    /// byte.
    struct GestureData {
        uint8_t bytes[72144];  ///< the record, whole
    };

    /// Reports a gesture. Called on a Binder thread of the client's process.
    ///
    /// `data` lies in the incoming request and is valid until the callback returns; whoever needs
    /// it later copies it. It is null when the request held no whole record, which an
    /// implementation must accept; a proxy sends no record for null.
    virtual int gestureCallback(GestureData* data) = 0;
};

static_assert(sizeof(IGestureManagerClient::GestureData) == 72144, "crosses as raw bytes");

}  // namespace pemaro
