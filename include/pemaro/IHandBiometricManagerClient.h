// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstdint>

#include "pemaro/Binder.h"
#include "pemaro/Export.h"

namespace pemaro {

/// The callback interface that a client registers with the hand biometric manager, which calls it
/// for every event of an enrollment, a scan or a match.
///
/// Descriptor and log tag: "pemaro.HandBiometricManagerClient", "IHandBiometricManagerClient". A
/// proxy returns 0x40000000 when the transaction failed (logged), else the client's status,
/// unchanged.
class ZELK_API IHandBiometricManagerClient : public android::IInterface {
  public:
    DECLARE_META_INTERFACE(HandBiometricManagerClient)

    /// One event: 10,016 bytes whose layout belongs to the service and the application. They cross
    /// Binder as they are, byte for byte.
    struct HandBioData {
        uint8_t bytes[10016];  ///< the record, whole
    };

    /// Reports an event. Called on a Binder thread of the client's process.
    ///
    /// `data` lies in the incoming request and is valid until the callback returns; whoever needs
    /// it later copies it. It is null when the request held no whole record, which an
    /// implementation must accept; a proxy sends no record for null.
    virtual int handBiometricCallback(HandBioData* data) = 0;
};

static_assert(sizeof(IHandBiometricManagerClient::HandBioData) == 10016, "crosses as raw bytes");

}  // namespace pemaro
