// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/files/FrameText.h"

#include <fmt/format.h>

#include <vector>

#include "tools/zelkctl/terminal/Json.h"

namespace pemaro::zelkctl {

std::string fingersCsvHead() {
    return "frame,sequence,time_ns,finger,x,y,peak\n";
}

std::string fingersCsv(uint64_t number, const frames::FrameContent& frame) {
    std::string lines;
    for (const frames::FingerRecord& finger : frame.fingers) {
        lines += fmt::format("{},{},{},{},{},{},{}\n", number, frame.header.sequence,
                             frame.header.timeNs, finger.id, finger.x, finger.y, finger.peak);
    }
    return lines;
}

std::string cellsCsvHead(uint32_t columns) {
    std::string line = "frame,sequence,time_ns,row";
    for (uint32_t column = 0; column < columns; ++column) {
        line += fmt::format(",c{}", column);
    }
    return line + "\n";
}

std::string cellsCsv(uint64_t number, const frames::FrameContent& frame) {
    std::string lines;
    const auto* cell = frame.image.data();
    for (uint32_t row = 0; row < frame.header.rows; ++row) {
        lines +=
                fmt::format("{},{},{},{}", number, frame.header.sequence, frame.header.timeNs, row);
        for (uint32_t column = 0; column < frame.header.columns; ++column) {
            lines += fmt::format(",{}", *cell++);
        }
        lines += '\n';
    }
    return lines;
}

std::string frameJson(uint64_t number, const frames::FrameContent& frame) {
    JsonArray fingers;
    for (const frames::FingerRecord& finger : frame.fingers) {
        fingers.add(JsonObject()
                            .add("finger", finger.id)
                            .add("x", finger.x)
                            .add("y", finger.y)
                            .add("peak", finger.peak));
    }
    return JsonObject()
                   .add("frame", static_cast<int64_t>(number))
                   .add("sequence", frame.header.sequence)
                   .add("time_ns", static_cast<int64_t>(frame.header.timeNs))
                   .add("filter", frame.header.filter)
                   .add("columns", frame.header.columns)
                   .add("rows", frame.header.rows)
                   .add("fingers", fingers)
                   .add("image", std::vector<int64_t>(frame.image.begin(), frame.image.end()))
                   .text() +
           "\n";
}

}  // namespace pemaro::zelkctl
