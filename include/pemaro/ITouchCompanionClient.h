// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "pemaro/Binder.h"
#include "pemaro/Export.h"

namespace pemaro {

/// The callback interface that a touch companion client registers with the service.
///
/// It has no operations: the service keeps the object as the identity of a connected client and may
/// watch it through Binder's death notification. Frames never cross it; they travel through the
/// shared ring (TouchCompanionSharedCblk.h).
///
/// Descriptor: "pemaro.TouchServiceClient".
class ZELK_API ITouchCompanionClient : public android::IInterface {
  public:
    DECLARE_META_INTERFACE(TouchCompanionClient)
};

}  // namespace pemaro
