// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "pemaro/Binder.h"
#include "pemaro/ITouchCompanionClient.h"

namespace pemaro {

/// Stub of ITouchCompanionClient: the side that lives in the client's process.
class ZELK_API BnTouchCompanionClient : public android::BnInterface<ITouchCompanionClient> {
  public:
    /// Called by Binder on one of its threads. A request without the interface token is answered
    /// with -1 (PERMISSION_DENIED) and an untouched reply; every other one with the answer of
    /// BBinder, since the interface defines no code.
    android::status_t onTransact(uint32_t code, const android::Parcel& data, android::Parcel* reply,
                                 uint32_t flags = 0) override;
};

}  // namespace pemaro
