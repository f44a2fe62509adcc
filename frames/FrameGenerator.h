// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstdint>
#include <vector>

#include "frames/Frame.h"

namespace pemaro::frames {

/// The last position across the panel, and the peak of a finger that presses firmly.
constexpr uint32_t kPositionMax = 65535;
constexpr int16_t kFingerPeak = 1200;

/// Draws the frames of a recording: fingers over a panel of as many cells as the frame has room for,
/// each a bell of capacitance around its position.
class FrameGenerator {
  public:
    /// REQUIRES: frameBytes >= sizeof(FrameHeader). There is room for so many fingers; those that do
    /// not fit, or that the header cannot count, are left out.
    FrameGenerator(uint32_t frameBytes, uint32_t fingers);

    /// The next frame, valid until the next call; its size is the frame's length. As many fingers as
    /// there is room for move along Lissajous figures.
    const std::vector<uint8_t>& draw(uint32_t sequence, uint64_t timeNs, uint32_t filter);

    /// The same with these fingers.
    const std::vector<uint8_t>& draw(uint32_t sequence, uint64_t timeNs, uint32_t filter,
                                     const std::vector<FingerRecord>& fingers);

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
    std::vector<FingerRecord> mMoving;
    std::vector<uint8_t> mFrame;
};

}  // namespace pemaro::frames
