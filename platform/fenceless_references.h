// SPDX-License-Identifier: Apache-2.0
// Reference counts are released with a decrement and, by the last owner, acquired with a fence. ThreadSanitizer
// does not follow fences and takes what the last owner does for a race: here each release acquires as well.
#pragma once

#include <atomic>

#define memory_order_release memory_order_acq_rel
