// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstdint>

#include "companion/RingReader.h"
#include "pemaro/TouchCompanionClient.h"

namespace pemaro {

/// What the log of the frame rate goes by; zeros at the start of a recording.
struct FrameStatistics {
    uint32_t frames = 0;
    int64_t startTime = 0;
    uint32_t lastSecond = 0;
};

/// Hands the frames of one block to a callback, in passes of one frame each. It holds all that it
/// needs, so that it outlives the client that made it.
class FrameDelivery {
  public:
    using DataCallback = TouchCompanionClient::DataCallback;

    /// See RingReader for `block` and `watch`. Without a callback frames are only released.
    FrameDelivery(const MappedBlock& block, DataCallback callback, void* context,
                  WaitWatch* watch = nullptr);

    /// TouchCompanionClient::processData().
    void pass(FrameStatistics& statistics);

    /// Whether the last pass found a ring that would let passes follow one another without a pause
    /// and without a frame, as only one can that breaks the rules.
    bool isStuck() const { return mReader.pace() == RingReader::Pace::Stuck; }

  private:
    RingReader mReader;
    const DataCallback mCallback;
    void* const mContext;
};

}  // namespace pemaro
