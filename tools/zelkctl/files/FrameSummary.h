// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstddef>
#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "frames/RecordingFile.h"

namespace pemaro::zelkctl {

/// The least and the greatest of some numbers.
struct Extent {
    uint32_t least = UINT32_MAX;
    uint32_t most = 0;

    void add(uint32_t value);
};

/// How numbers are spread. A percentile is the smallest of them that so many percent are not above.
struct Spread {
    double least;
    double mean;
    double p50;
    double p90;
    double p99;
    double most;
};

/// Nothing of nothing.
std::optional<Spread> spreadOf(std::vector<double> values);

/// What a recording holds.
struct FrameSummary {
    struct Gap {
        uint64_t frame;  ///< the first behind the gap, counted from 0 in the file
        uint64_t offset;
        uint64_t lost;  ///< 0 where the numbers go back
    };

    uint64_t frames = 0;  ///< intact ones
    Extent lengths;
    Extent columns;
    Extent rows;
    Extent fingers;
    double seconds = 0;  ///< from the first frame to the last, without where the time goes back
    uint64_t steps = 0;  ///< from a frame to the next within these seconds
    /// Between frames of which none is missing, in milliseconds.
    std::optional<Spread> intervals;
    uint64_t lost = 0;
    std::vector<Gap> gaps;
    std::vector<frames::RecordingFile::Part> corrupt;
    std::optional<frames::RecordingFile::Part> truncated;

    /// Frames a second.
    double rate() const { return seconds > 0 ? static_cast<double>(steps) / seconds : 0; }
};

FrameSummary summarize(const frames::RecordingFile& file);

/// The hottest cell of all frames, at least 1, so that pictures of them can be compared. Shows how far
/// it is.
int hottestCell(const frames::RecordingFile& file);

/// Some lines for people, in which the first ten of many are told.
std::string summaryText(const frames::RecordingFile& file, const FrameSummary& summary);

/// A JSON object, in which all are told.
std::string summaryJson(const frames::RecordingFile& file, const FrameSummary& summary);

/// What is damaged in a recording, in a few words; empty for one that is whole.
std::string damageText(const FrameSummary& summary);

}  // namespace pemaro::zelkctl
