// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/files/FrameSummary.h"

#include <fmt/core.h>

#include <algorithm>
#include <cmath>
#include <numeric>

#include "frames/FrameContent.h"
#include "frames/Sequence.h"
#include "tools/zelkctl/terminal/Json.h"
#include "tools/zelkctl/terminal/Printable.h"
#include "tools/zelkctl/terminal/ProgressLine.h"

namespace pemaro::zelkctl {
namespace {

using frames::RecordingFile;

constexpr size_t kMaxLines = 10;

std::string extentText(const Extent& extent) {
    return extent.least == extent.most ? std::to_string(extent.most)
                                       : fmt::format("{} to {}", extent.least, extent.most);
}

void addExtent(JsonObject& object, const char* name, const Extent& extent) {
    object.add(name, JsonObject().add("min", extent.least).add("max", extent.most));
}

void addSpread(JsonObject& object, const char* name, const Spread& spread) {
    object.add(name, JsonObject()
                             .addReal("min", spread.least)
                             .addReal("mean", spread.mean)
                             .addReal("p50", spread.p50)
                             .addReal("p90", spread.p90)
                             .addReal("p99", spread.p99)
                             .addReal("max", spread.most));
}

void addPart(JsonObject& object, const RecordingFile::Part& part) {
    object.add("offset", static_cast<int64_t>(part.offset))
            .add("bytes", static_cast<int64_t>(part.length))
            .add("problem", part.problem);
}

/// Each in a line of its own, as long as there are not too many.
template <typename Items, typename Text>
std::string list(const Items& items, Text text) {
    std::string lines;
    for (size_t i = 0; i < items.size() && i < kMaxLines; ++i) {
        lines += "  " + text(items[i]) + "\n";
    }
    if (items.size() > kMaxLines) {
        lines += fmt::format("  and {} more (--json tells all)\n", items.size() - kMaxLines);
    }
    return lines;
}

std::string gapText(const FrameSummary::Gap& gap) {
    const std::string lost =
            gap.lost == 0 ? "the numbers go back" : fmt::format("{} lost", gap.lost);
    return fmt::format("before frame {}, offset {}: {}", gap.frame, gap.offset, lost);
}

std::string corruptText(const RecordingFile::Part& part) {
    return fmt::format("offset {}, {} bytes: {}", part.offset, part.length, part.problem);
}

std::string contentText(const FrameSummary& summary) {
    std::string text = fmt::format("frames      {} of {} bytes\n", summary.frames,
                                   extentText(summary.lengths));
    text += fmt::format("image       {} columns, {} rows\n", extentText(summary.columns),
                        extentText(summary.rows));
    text += fmt::format("fingers     {}\n", extentText(summary.fingers));
    text += fmt::format("duration    {:.3f} s, {:.1f} frames/s\n", summary.seconds, summary.rate());
    if (summary.intervals) {
        const Spread& spread = *summary.intervals;
        text += fmt::format(
                "intervals   {:.3f} ms on average; least {:.3f}, p50 {:.3f}, p90 {:.3f}, p99 "
                "{:.3f}, "
                "most {:.3f}\n",
                spread.mean, spread.least, spread.p50, spread.p90, spread.p99, spread.most);
    }
    return text;
}

}  // namespace

void Extent::add(uint32_t value) {
    least = std::min(least, value);
    most = std::max(most, value);
}

std::optional<Spread> spreadOf(std::vector<double> values) {
    if (values.empty()) {
        return std::nullopt;
    }
    std::sort(values.begin(), values.end());
    const auto percentile = [&values](int percent) {
        return values[(values.size() * percent + 99) / 100 - 1];
    };
    const double sum = std::accumulate(values.begin(), values.end(), 0.0);
    return Spread{values.front(), sum / static_cast<double>(values.size()),
                  percentile(50), percentile(90),
                  percentile(99), values.back()};
}

FrameSummary summarize(const RecordingFile& file) {
    FrameSummary summary;
    frames::Sequence sequence;
    std::vector<double> intervals;
    uint64_t lastTime = 0;
    double nanoseconds = 0;
    for (const RecordingFile::Part& part : file.parts()) {
        if (part.kind == RecordingFile::Kind::kCorrupt) {
            summary.corrupt.push_back(part);
        } else if (part.kind == RecordingFile::Kind::kTruncated) {
            summary.truncated = part;
        }
        if (part.kind != RecordingFile::Kind::kFrame) {
            continue;
        }
        uint64_t lost = 0;
        const bool isGap = sequence.isGap(part.header.sequence, &lost);
        if (isGap) {
            summary.gaps.push_back({summary.frames, part.offset, lost});
            summary.lost += lost;
        }
        if (summary.frames != 0) {
            const auto passed =
                    static_cast<double>(static_cast<int64_t>(part.header.timeNs - lastTime));
            // Where two recordings meet, the clock of one is no measure for the other.
            if (passed >= 0) {
                nanoseconds += passed;
                summary.steps += 1;
            }
            if (!isGap) {
                intervals.push_back(passed / 1e6);
            }
        }
        lastTime = part.header.timeNs;
        summary.frames += 1;
        summary.lengths.add(part.header.length);
        summary.columns.add(part.header.columns);
        summary.rows.add(part.header.rows);
        summary.fingers.add(part.header.fingers);
    }
    summary.seconds = nanoseconds / 1e9;
    summary.intervals = spreadOf(std::move(intervals));
    return summary;
}

int hottestCell(const RecordingFile& file) {
    ProgressLine progress("looking at the images", "frames");
    int hottest = 1;
    uint64_t done = 0;
    for (const RecordingFile::Part& part : file.parts()) {
        const uint8_t* frame =
                part.kind == RecordingFile::Kind::kFrame ? file.bytes(part) : nullptr;
        if (frame != nullptr) {
            for (const int16_t cell : frames::readFrameContent(frame).image) {
                hottest = std::max<int>(hottest, cell);
            }
        }
        if (!progress.step(++done, file.parts().size())) {
            break;
        }
    }
    return hottest;
}

std::string summaryText(const RecordingFile& file, const FrameSummary& summary) {
    std::string text =
            fmt::format("recording   {}, {} bytes\n", printable(file.path()), file.size());
    text += summary.frames == 0 ? "frames      0\n" : contentText(summary);
    text += fmt::format("lost        {} in {} gaps\n", summary.lost, summary.gaps.size());
    text += list(summary.gaps, gapText);
    text += fmt::format("corrupt     {}\n", summary.corrupt.size());
    text += list(summary.corrupt, corruptText);
    if (summary.truncated) {
        text += fmt::format("truncated   {}\n", corruptText(*summary.truncated));
    }
    return text;
}

std::string summaryJson(const RecordingFile& file, const FrameSummary& summary) {
    JsonObject object;
    object.add("file", file.path());
    object.add("bytes", static_cast<int64_t>(file.size()));
    object.add("frames", static_cast<int64_t>(summary.frames));
    if (summary.frames != 0) {
        addExtent(object, "lengths", summary.lengths);
        addExtent(object, "columns", summary.columns);
        addExtent(object, "rows", summary.rows);
        addExtent(object, "fingers", summary.fingers);
        object.addReal("seconds", summary.seconds).addReal("rate", summary.rate());
    }
    if (summary.intervals) {
        addSpread(object, "intervals_ms", *summary.intervals);
    }
    JsonArray gaps;
    for (const FrameSummary::Gap& gap : summary.gaps) {
        gaps.add(JsonObject()
                         .add("frame", static_cast<int64_t>(gap.frame))
                         .add("offset", static_cast<int64_t>(gap.offset))
                         .add("lost", static_cast<int64_t>(gap.lost)));
    }
    JsonArray corrupt;
    for (const RecordingFile::Part& part : summary.corrupt) {
        JsonObject where;
        addPart(where, part);
        corrupt.add(where);
    }
    object.add("lost", static_cast<int64_t>(summary.lost))
            .add("gaps", gaps)
            .add("corrupt", corrupt);
    if (summary.truncated) {
        JsonObject truncated;
        addPart(truncated, *summary.truncated);
        object.add("truncated", truncated);
    }
    return object.text();
}

std::string damageText(const FrameSummary& summary) {
    std::string text;
    if (!summary.corrupt.empty()) {
        text = fmt::format("{} corrupt, the first at offset {}", summary.corrupt.size(),
                           summary.corrupt[0].offset);
    }
    if (summary.truncated) {
        text += fmt::format("{}truncated within the frame at offset {}", text.empty() ? "" : "; ",
                            summary.truncated->offset);
    }
    return text;
}

}  // namespace pemaro::zelkctl
