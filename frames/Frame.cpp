// SPDX-License-Identifier: Apache-2.0
#include "frames/Frame.h"

#include <cstring>

#include "frames/Checksum.h"

namespace pemaro::frames {

uint32_t frameChecksum(const void* frame, size_t length) {
    constexpr size_t kField = offsetof(FrameHeader, checksum);
    constexpr uint32_t kZero = 0;
    const auto* bytes = static_cast<const uint8_t*>(frame);
    uint32_t crc = crc32(bytes, kField);
    crc = crc32(&kZero, sizeof(kZero), crc);
    return crc32(bytes + kField + sizeof(kZero), length - kField - sizeof(kZero), crc);
}

bool readFrameHeader(const void* frame, size_t length, FrameHeader* header) {
    if (length < sizeof(*header)) {
        return false;
    }
    memcpy(header, frame, sizeof(*header));
    return header->magic == kFrameMagic && header->version == kFrameVersion &&
           header->headerBytes == sizeof(*header);
}

const char* frameHeaderFault(const FrameHeader& header, uint64_t length) {
    if (header.length != length) {
        return "another length than its header tells";
    }
    const uint64_t content = sizeof(header) + header.fingers * sizeof(FingerRecord) +
                             sizeof(int16_t) * header.columns * header.rows;
    return content == length ? nullptr : "another length than its contents";
}

const char* frameFault(const void* frame, size_t length) {
    FrameHeader header;
    if (length < sizeof(header)) {
        return "shorter than its header";
    }
    if (!readFrameHeader(frame, length, &header)) {
        return "not a frame of this kind";
    }
    const char* fault = frameHeaderFault(header, length);
    if (fault != nullptr) {
        return fault;
    }
    return frameChecksum(frame, length) == header.checksum ? nullptr : kWrongChecksum;
}

}  // namespace pemaro::frames
