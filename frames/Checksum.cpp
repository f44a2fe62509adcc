// SPDX-License-Identifier: Apache-2.0
#include "frames/Checksum.h"

#include <zlib.h>

namespace pemaro::frames {

uint32_t crc32(const void* data, size_t size, uint32_t crc) {
    return static_cast<uint32_t>(::crc32_z(crc, static_cast<const Bytef*>(data), size));
}

}  // namespace pemaro::frames
