// SPDX-License-Identifier: Apache-2.0
#include "frames/SpanChecksums.h"

#include <algorithm>

#include "frames/Checksum.h"

namespace pemaro::frames {

bool SpanChecksums::add(uint64_t begin, uint64_t end, uint32_t* crc) {
    if (mBlocks.empty() || begin < mBegin || begin >= mEnd) {
        mBegin = begin;
        mEnd = begin;
        mWhole = 0;
        mBlocks.assign(1, 0);
    }
    uint32_t before = 0;
    uint32_t behind = 0;
    if (!upTo(begin, &before) || !upTo(end, &behind)) {
        return false;
    }
    *crc = crc32Over(*crc, before, behind, end - begin);
    return true;
}

/// The CRC-32 from the beginning to there.
bool SpanChecksums::upTo(uint64_t offset, uint32_t* crc) {
    while (mEnd < offset) {
        const uint64_t next = std::min(offset, nextBlock());
        if (!mRead(mEnd, next, &mWhole)) {
            return false;
        }
        mEnd = next;
        if (mEnd == nextBlock()) {
            mBlocks.push_back(mWhole);
        }
    }
    if (offset == mEnd) {
        *crc = mWhole;
        return true;
    }
    const uint64_t block = (offset - mBegin) / kBlockBytes;
    *crc = mBlocks[block];
    return mRead(mBegin + block * kBlockBytes, offset, crc);
}

}  // namespace pemaro::frames
