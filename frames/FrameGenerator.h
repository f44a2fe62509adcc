// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstdint>
#include <vector>

#include "frames/Frame.h"

namespace pemaro::frames {

/// Draws the frames of a recording: fingers that move along Lissajous figures over a panel of as
/// many cells as the frame has room for, each finger a bell of capacitance around its position.
class FrameGenerator {
  public:
    /// REQUIRES: frameBytes >= sizeof(FrameHeader). Fingers that do not fit are left out.
    FrameGenerator(uint32_t frameBytes, uint32_t fingers);

    /// The next frame, valid until the next call; its size is the frame's length.
    const std::vector<uint8_t>& draw(uint32_t sequence, uint64_t timeNs, uint32_t filter);

  private:
    struct Axis {
        uint32_t first = 0;
        std::vector<float> weights;
    };

    void drawFinger(const FingerRecord& finger, uint8_t* image) const;
    static Axis bell(uint32_t position, uint32_t cells);

    uint32_t mFingers;
    uint32_t mColumns;
    uint32_t mRows;
    std::vector<uint8_t> mFrame;
};

}  // namespace pemaro::frames
