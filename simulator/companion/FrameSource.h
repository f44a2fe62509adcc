// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <chrono>
#include <cstddef>
#include <cstdint>
#include <optional>

namespace pemaro::simulator {

/// Where a recording's frames come from. Used by one thread at a time.
class FrameSource {
  public:
    /// The bytes of a frame, which live until the next one is asked for.
    struct Frame {
        const void* bytes;
        size_t length;
    };

    virtual ~FrameSource() = default;

    /// Whether frames are due at certain times. Else each is due when there is room for it.
    virtual bool isPaced() const = 0;

    /// How long after the start of the recording the next frame is due; nothing after the last one.
    /// It never goes back.
    virtual std::optional<std::chrono::nanoseconds> due() const = 0;

    /// The next frame, for which a fresh one can use these. REQUIRES: due() has a value.
    virtual Frame next(uint32_t sequence, uint64_t timeNs, uint32_t filter) = 0;
};

}  // namespace pemaro::simulator
