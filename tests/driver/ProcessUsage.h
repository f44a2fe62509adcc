// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <sys/types.h>

namespace pemaro::test {

/// What a process uses of what can leak.
struct ProcessUsage {
    explicit ProcessUsage(pid_t pid);

    int threads;
    int descriptors;
    int mappings;
    int memoryKiB;  ///< resident
};

/// Each has grown by less than `leeway`: Binder's threads and the heaps of the allocator come and
/// go by a few, while a leak is one a round.
void expectNoGrowth(const ProcessUsage& before, const ProcessUsage& after, int leeway);

}  // namespace pemaro::test
