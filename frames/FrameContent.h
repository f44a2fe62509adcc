// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstdint>
#include <vector>

#include "frames/Frame.h"

namespace pemaro::frames {

/// What a frame shows.
struct FrameContent {
    FrameHeader header;
    std::vector<FingerRecord> fingers;
    std::vector<int16_t> image;  ///< row by row
};

/// Copies it out. REQUIRES: the frame is intact, see frameFault().
FrameContent readFrameContent(const void* frame);

}  // namespace pemaro::frames
