// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "pemaro/Binder.h"

namespace pemaro {

// What the platform's releases name differently. The older name is taken where it exists, since it
// exists on the most devices; which of the two a header declares is found out at compile time.

template <typename Memory>
auto mappedAddressOf(const Memory& memory, int) -> decltype(memory.pointer()) {
    return memory.pointer();
}

template <typename Memory>
auto mappedAddressOf(const Memory& memory, long) -> decltype(memory.unsecurePointer()) {
    return memory.unsecurePointer();
}

/// Where `memory` is mapped in this process, or null: `pointer()` up to Android 10, which Android
/// 11 renamed to `unsecurePointer()` because the other side may change what it points to at any
/// time.
inline void* mappedAddress(const android::sp<android::IMemory>& memory) {
    return mappedAddressOf(*memory, 0);
}

}  // namespace pemaro
