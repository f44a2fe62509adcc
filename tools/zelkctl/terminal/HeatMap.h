// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>
#include <vector>

#include "frames/FrameContent.h"
#include "tools/zelkctl/terminal/TerminalTraits.h"

namespace pemaro::zelkctl {

/// The room that a heat map has, and how it is drawn there.
struct HeatMapStyle {
    int columns = 80;  ///< characters
    int rows = 24;
    Colors colors = Colors::kNone;
    bool unicode = false;
    int full = 1;  ///< what is as hot as it gets
};

/// The image of a frame as lines for a terminal, from the top to the bottom. A character is one pixel
/// wide and two high: the upper half of a block in the colours of both where there are colours and
/// blocks, else in the colour or the density of the hotter one. The map is as large as fits, whole
/// pixels for each cell if it can; a pixel of several cells is as hot as the hottest. Each finger
/// stands there as the last digit of its number. Nothing where there is no image or no room.
std::vector<std::string> drawHeatMap(const frames::FrameContent& frame, const HeatMapStyle& style);

}  // namespace pemaro::zelkctl
