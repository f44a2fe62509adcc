// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstdint>
#include <functional>
#include <utility>
#include <vector>

namespace pemaro::frames {

/// Checksums of spans of a file, however many there are and however they overlap.
///
/// Where the spans begin further and further behind, each byte between is read once for all of them, and up
/// to a block at either end of each span once more: the sum from the first span on is kept at every block,
/// and of two sums comes that of what is between them. Behind what was read so far it begins anew, so that
/// spans without a common byte cost nothing but themselves.
class SpanChecksums {
  public:
    /// How far apart sums are kept: a thousandth of what they are of.
    static constexpr uint64_t kBlockBytes = 4096;

    /// Continues a CRC-32 by these bytes of the file, a block at most; false when it cannot.
    using Read = std::function<bool(uint64_t begin, uint64_t end, uint32_t* crc)>;

    explicit SpanChecksums(Read read) : mRead(std::move(read)) {}

    /// Continues a CRC-32 by these bytes of the file; false, for good, when they could not be read.
    bool add(uint64_t begin, uint64_t end, uint32_t* crc);

  private:
    bool upTo(uint64_t offset, uint32_t* crc);
    uint64_t nextBlock() const { return mBegin + mBlocks.size() * kBlockBytes; }

    const Read mRead;
    uint64_t mBegin = 0;
    uint64_t mEnd = 0;
    uint32_t mWhole = 0;            ///< from the beginning to the end
    std::vector<uint32_t> mBlocks;  ///< from the beginning to each block's beginning
};

}  // namespace pemaro::frames
