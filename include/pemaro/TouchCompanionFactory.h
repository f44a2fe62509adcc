// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "pemaro/Export.h"

extern "C" {

/// Makes an object for a caller that loaded the library by name. The pairs, where the version is
/// the class identifier shifted left by 16 bits:
///
///   classID  version    *instance is an
///      2048  0x8000000  pemaro::ITouchCompanionFacade
///      1792  0x7000000  pemaro::ITouchCompanionFacadeOld
///         4  0x40000    pemaro::ISerializableParams4
///         3  0x30000    pemaro::ISerializableParams3
///
/// Returns 0, and the caller owns the object and destroys it with `delete`; or 0x4000000D for any
/// other pair, and `*instance` is as it was. `instance` must not be null. Callable from any thread.
ZELK_API int DURAPemaroCreateInstance(int classID, int version, void** instance);

/// The same factory under its other name.
ZELK_API int VEXPemaroCreateInstance(int classID, int version, void** instance);

}  // extern "C"
