// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstddef>
#include <cstdint>

namespace pemaro::frames {

/// CRC-32 (the one of zlib) of `size` bytes, continued from `crc`; start with 0.
uint32_t crc32(const void* data, size_t size, uint32_t crc = 0);

}  // namespace pemaro::frames
