// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstdint>
#include <string>

#include "frames/RecordingFile.h"
#include "tools/zelkctl/files/FrameSummary.h"

namespace pemaro::zelkctl {

/// The most that the frames of a page may take once they are unpacked.
constexpr uint64_t kMaxReportBytes = uint64_t{256} << 20;

/// The intact frames as the page's script reads them, one after another, little-endian:
///
///   offset  size  field
///        0     8  seconds since the first frame, a double
///        8     4  number: the frame's place in the recording, from 0
///       12     4  sequence
///       16     4  lost: frames missing before this one
///       20     2  columns
///       22     2  rows
///       24     2  fingers
///       26     2  0
///       28     .  fingers x 8 bytes: number, x, y, peak
///        .     .  rows x columns bytes: how hot each cell is, from 0 to 254
///
/// Only every so many of them. Shows how far it is.
std::string reportFrames(const frames::RecordingFile& file, uint64_t every);

/// An HTML page that plays the recording; it needs nothing but itself. Empty, with a sentence about why
/// in `problem`, when there are no frames, or too many, or when the command was asked to stop. Shows
/// how far it is.
std::string reportPage(const frames::RecordingFile& file, const FrameSummary& summary,
                       uint64_t every, std::string* problem);

}  // namespace pemaro::zelkctl
