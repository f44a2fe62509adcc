// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstdint>

namespace pemaro::frames {

/// Follows the sequence numbers of a recording, the first of which is 0, and finds what is missing.
class Sequence {
  public:
    /// Whether frames are missing before the one that has this number. `lost` is how many, and 0 where
    /// the numbers go back, which is a gap of unknown size.
    bool isGap(uint32_t number, uint64_t* lost) {
        const auto missing = static_cast<int32_t>(number - mNext);
        mNext = number + 1;
        *lost = missing > 0 ? static_cast<uint64_t>(missing) : 0;
        return missing != 0;
    }

  private:
    uint32_t mNext = 0;
};

}  // namespace pemaro::frames
