// SPDX-License-Identifier: Apache-2.0
#include "frames/FrameContent.h"

#include <cstring>

namespace pemaro::frames {

FrameContent readFrameContent(const void* frame) {
    FrameContent content;
    memcpy(&content.header, frame, sizeof(content.header));
    const auto* next = static_cast<const uint8_t*>(frame) + sizeof(content.header);
    const auto take = [&next](auto& values, size_t count) {
        values.resize(count);
        const size_t bytes = count * sizeof(values[0]);
        if (bytes != 0) {
            memcpy(values.data(), next, bytes);
        }
        next += bytes;
    };
    take(content.fingers, content.header.fingers);
    take(content.image, size_t{content.header.rows} * content.header.columns);
    return content;
}

}  // namespace pemaro::frames
