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

/// What `manager` knows by this name, or null: `getService()`, which asks for some five seconds. From
/// Android 14 on a call warns that it does; here that is wanted.
template <typename Manager>
android::sp<android::IBinder> polledService(const Manager& manager, const android::String16& name) {
#pragma GCC diagnostic push
#pragma GCC diagnostic ignored "-Wdeprecated-declarations"
    return manager.getService(name);
#pragma GCC diagnostic pop
}

}  // namespace pemaro
