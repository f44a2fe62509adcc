// SPDX-License-Identifier: Apache-2.0
#include "frames/Checksum.h"

#include <zlib.h>

namespace pemaro::frames {

uint32_t crc32(const void* data, size_t size, uint32_t crc) {
    return static_cast<uint32_t>(::crc32_z(crc, static_cast<const Bytef*>(data), size));
}

uint32_t crc32Over(uint32_t crc, uint32_t from, uint32_t to, uint64_t size) {
    // A CRC is linear: two that differ are made to differ in another way by the same bytes, whatever those are.
    return static_cast<uint32_t>(::crc32_combine(crc ^ from, to, static_cast<z_off_t>(size)));
}

}  // namespace pemaro::frames
