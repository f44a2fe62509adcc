// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <chrono>
#include <cstdint>

namespace pemaro::simulator {

/// CLOCK_MONOTONIC in nanoseconds, as records and frames carry it.
inline uint64_t monotonicTimeNs() {
    const auto now = std::chrono::steady_clock::now().time_since_epoch();
    return static_cast<uint64_t>(std::chrono::duration_cast<std::chrono::nanoseconds>(now).count());
}

}  // namespace pemaro::simulator
