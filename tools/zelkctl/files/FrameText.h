// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstdint>
#include <string>

#include "frames/FrameContent.h"

namespace pemaro::zelkctl {

// Frames as text; `number` is the frame's place in its file, from 0. Each text ends its last line.

/// The fingers, a line of comma-separated values each.
std::string fingersCsvHead();
std::string fingersCsv(uint64_t number, const frames::FrameContent& frame);

/// The image, a line for each row of cells.
std::string cellsCsvHead(uint32_t columns);
std::string cellsCsv(uint64_t number, const frames::FrameContent& frame);

/// All of it, as a JSON object on a line.
std::string frameJson(uint64_t number, const frames::FrameContent& frame);

}  // namespace pemaro::zelkctl
