// SPDX-License-Identifier: Apache-2.0
// libc++ of the device's toolchain lets these names be found without std::; IMemory.cpp relies on it.
#pragma once

#include <atomic>

// Beside libstdc++'s header clang's stdatomic.h, which IMemory.cpp includes, would declare others of these names.
#ifdef __clang__
#define __CLANG_STDATOMIC_H
#endif

using std::memory_order_acquire;
using std::memory_order_relaxed;
using std::memory_order_release;
