// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstddef>

namespace pemaro::test {

/// What was allocated between two places, by whoever: a program that links this counts all of its
/// allocations. Bytes are those of the blocks as the allocator rounds them.
struct Allocations {
    size_t count = 0;      ///< blocks allocated
    size_t heldBytes = 0;  ///< bytes allocated and not freed
    size_t peakBytes = 0;  ///< the most that was held at any time
};

/// Forgets what was counted.
void startCounting();

/// Stops, and tells what was counted.
Allocations stopCounting();

}  // namespace pemaro::test
