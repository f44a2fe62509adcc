// SPDX-License-Identifier: Apache-2.0
// libc++ of the device's toolchain lets these names be found without std::; IMemory.cpp relies on it.
#pragma once

#include <atomic>

using std::memory_order_acquire;
using std::memory_order_relaxed;
using std::memory_order_release;
