// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/files/FrameReport.h"

#include <fmt/format.h>
// What is to be packed is not changed.
#define ZLIB_CONST
#include <zlib.h>

#include <algorithm>
#include <cstring>
#include <vector>

#include "frames/FrameContent.h"
#include "frames/Sequence.h"
#include "tools/zelkctl/files/ReportTemplate.h"
#include "tools/zelkctl/terminal/Heat.h"
#include "tools/zelkctl/terminal/ProgressLine.h"
#include "tools/zelkctl/terminal/Supervisor.h"

namespace pemaro::zelkctl {
namespace {

using frames::RecordingFile;

struct FrameHead {
    double seconds;
    uint32_t number;
    uint32_t sequence;
    uint32_t lost;
    uint16_t columns;
    uint16_t rows;
    uint16_t fingers;
    uint16_t reserved;
    uint32_t padding;
};
constexpr size_t kFrameHeadBytes = 28;
static_assert(offsetof(FrameHead, fingers) == 24, "page layout");

template <typename Value>
void append(std::string& bytes, const Value* values, size_t size) {
    if (size != 0) {
        bytes.append(reinterpret_cast<const char*>(values), size);
    }
}

std::string base64(const std::string& bytes) {
    constexpr char kDigits[] = "ABCDEFGHIJKLMNOPQRSTUVWXYZabcdefghijklmnopqrstuvwxyz0123456789+/";
    std::string text;
    text.reserve((bytes.size() + 2) / 3 * 4);
    for (size_t i = 0; i < bytes.size(); i += 3) {
        const size_t count = std::min<size_t>(3, bytes.size() - i);
        uint32_t group = 0;
        for (size_t k = 0; k < 3; ++k) {
            group = group << 8 | (k < count ? static_cast<uint8_t>(bytes[i + k]) : 0);
        }
        for (size_t k = 0; k < 4; ++k) {
            text += k <= count ? kDigits[group >> (18 - 6 * k) & 63] : '=';
        }
    }
    return text;
}

/// Empty when the command was asked to stop.
std::string deflated(const std::string& bytes) {
    constexpr uInt kPiece = 1 << 20;
    ProgressLine progress("packing", "bytes");
    z_stream stream{};
    deflateInit(&stream, Z_BEST_COMPRESSION);
    std::string packed(deflateBound(&stream, bytes.size()), '\0');
    stream.next_in = reinterpret_cast<const Bytef*>(bytes.data());
    stream.next_out = reinterpret_cast<Bytef*>(&packed[0]);
    // All of it fits, so that each piece is taken whole.
    stream.avail_out = static_cast<uInt>(packed.size());
    int result = Z_OK;
    while (result == Z_OK && progress.step(stream.total_in, bytes.size())) {
        const size_t left = bytes.size() - stream.total_in;
        stream.avail_in = static_cast<uInt>(std::min<size_t>(left, kPiece));
        result = deflate(&stream, left <= kPiece ? Z_FINISH : Z_NO_FLUSH);
    }
    packed.resize(result == Z_STREAM_END ? stream.total_out : 0);
    deflateEnd(&stream);
    return packed;
}

/// JSON that does not end the script element that it stands in, whatever names are in it.
std::string withoutTags(const std::string& json) {
    std::string text;
    for (const char character : json) {
        text += character == '<' ? std::string("\\u003C") : std::string(1, character);
    }
    return text;
}

std::string palette() {
    std::string list;
    for (int level = 0; level <= kHottest; ++level) {
        const Color color = heatColor(static_cast<uint8_t>(level));
        list += fmt::format("{}[{},{},{}]", level == 0 ? "" : ",", color.red, color.green,
                            color.blue);
    }
    return "[" + list + "]";
}

void replaceOnce(std::string& text, const std::string& mark, const std::string& by) {
    text.replace(text.find(mark), mark.size(), by);
}

}  // namespace

std::string reportFrames(const RecordingFile& file, uint64_t every) {
    const int full = hottestCell(file);
    frames::Sequence sequence;
    std::string bytes;
    uint64_t firstTime = 0;
    uint32_t number = 0;
    uint64_t lost = 0;
    uint64_t done = 0;
    ProgressLine progress("collecting", "frames");
    for (const RecordingFile::Part& part : file.parts()) {
        if (!progress.step(++done, file.parts().size())) {
            break;
        }
        if (part.kind != RecordingFile::Kind::kFrame) {
            continue;
        }
        uint64_t missing = 0;
        sequence.isGap(part.header.sequence, &missing);
        lost += missing;
        if (number == 0) {
            firstTime = part.header.timeNs;
        }
        if (number++ % every != 0) {
            continue;
        }
        const uint8_t* found = file.bytes(part);
        if (found == nullptr) {
            break;
        }
        const frames::FrameContent frame = frames::readFrameContent(found);
        FrameHead head{};
        head.seconds =
                static_cast<double>(static_cast<int64_t>(part.header.timeNs - firstTime)) / 1e9;
        head.number = number - 1;
        head.sequence = part.header.sequence;
        head.lost = static_cast<uint32_t>(std::min<uint64_t>(lost, UINT32_MAX));
        head.columns = part.header.columns;
        head.rows = part.header.rows;
        head.fingers = part.header.fingers;
        append(bytes, &head, kFrameHeadBytes);
        append(bytes, frame.fingers.data(), frame.fingers.size() * sizeof(frames::FingerRecord));
        for (const int16_t cell : frame.image) {
            bytes += static_cast<char>(heatLevel(cell, full));
        }
        lost = 0;
    }
    return bytes;
}

std::string reportPage(const RecordingFile& file, const FrameSummary& summary, uint64_t every,
                       std::string* problem) {
    if (summary.frames == 0) {
        *problem = "there are no frames to show";
        return "";
    }
    // A cell takes half of what it takes in the recording.
    if (file.size() / 2 / every > kMaxReportBytes) {
        *problem = fmt::format("the recording is too long for one page; with --every {} it fits",
                               file.size() / 2 / kMaxReportBytes + 1);
        return "";
    }
    const std::string frames = deflated(reportFrames(file, every));
    if (mustStop() || !file.problem().empty()) {
        *problem = file.problem();
        return "";
    }
    std::string page = kReportTemplate;
    replaceOnce(page, "@SUMMARY@", withoutTags(summaryJson(file, summary)));
    replaceOnce(page, "@PALETTE@", palette());
    replaceOnce(page, "@FRAMES@", base64(frames));
    return page;
}

}  // namespace pemaro::zelkctl
