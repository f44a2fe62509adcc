// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>

#include "frames/FrameContent.h"

namespace pemaro::zelkctl {

/// How a frame is drawn.
struct PictureStyle {
    unsigned scale = 8;  ///< pixels of a cell, in both directions
    int full = 1;        ///< what is as hot as it gets
};

/// A PNG file: the image as a heat map, with a white cross at each finger. Empty for a frame without an
/// image.
std::string drawFrame(const frames::FrameContent& frame, const PictureStyle& style);

}  // namespace pemaro::zelkctl
