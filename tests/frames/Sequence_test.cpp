// SPDX-License-Identifier: Apache-2.0
#include "frames/Sequence.h"

#include <gtest/gtest.h>

#include <vector>

namespace pemaro::frames {

TEST(Sequence, FindsGapsAndHowMuchIsMissing) {
    const struct {
        std::vector<uint32_t> numbers;
        int gaps;
        uint64_t lost;
    } rows[] = {
            {{0, 1, 2}, 0, 0}, {{2, 3}, 1, 2},       {{0, 2, 5}, 2, 3},
            {{0, 1, 1}, 1, 0}, {{0, 5, 3, 4}, 2, 4}, {{0xFFFFFFFF}, 1, 0},
    };
    for (const auto& row : rows) {
        Sequence sequence;
        int gaps = 0;
        uint64_t lost = 0;
        for (const uint32_t number : row.numbers) {
            uint64_t missing = 77;
            gaps += sequence.isGap(number, &missing) ? 1 : 0;
            lost += missing;
        }
        EXPECT_EQ(row.gaps, gaps);
        EXPECT_EQ(row.lost, lost);
    }
}

}  // namespace pemaro::frames
