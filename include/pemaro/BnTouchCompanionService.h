// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "pemaro/Binder.h"
#include "pemaro/ITouchCompanionService.h"

namespace pemaro {

/// Stub of ITouchCompanionService, from which a service derives.
///
/// It unpacks each request, calls the operation and packs the answer; a service implements the
/// operations and nothing of the transport.
class ZELK_API BnTouchCompanionService : public android::BnInterface<ITouchCompanionService> {
  public:
    /// Called by Binder on one of its threads.
    ///
    /// A request without the interface token is answered with -1 (PERMISSION_DENIED) and an
    /// untouched reply, before its code is looked at; a code of no operation goes to BBinder.
    /// Otherwise the result is 0 with the operation's status in the reply, except that
    ///   - unregisterClient() returns its status as the result and writes no reply,
    ///   - getCblk() without a block returns 0x40000006,
    ///   - a binary configuration transfer returns 0x40000006 when its buffer cannot be allocated,
    ///     0x40000000 when the bytes cannot be read or there are none, and 0x4000000A when the
    ///     configuration does not fit the caller's buffer.
    /// These results are positive, and the driver sends a result only when it is negative: a caller
    /// in another process receives what the reply holds at that point, and success.
    android::status_t onTransact(uint32_t code, const android::Parcel& data, android::Parcel* reply,
                                 uint32_t flags = 0) override;
};

}  // namespace pemaro
