// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstddef>
#include <cstdint>

namespace pemaro::frames {

/// CRC-32 (the one of zlib) of `size` bytes, continued from `crc`; start with 0.
uint32_t crc32(const void* data, size_t size, uint32_t crc = 0);

/// What `crc` is continued to by those `size` bytes that continue `from` to `to`, without a look at them.
uint32_t crc32Over(uint32_t crc, uint32_t from, uint32_t to, uint64_t size);

}  // namespace pemaro::frames
