// SPDX-License-Identifier: Apache-2.0
#include "tools/common/ProgressLine.h"

#include <gtest/gtest.h>

namespace pemaro::tools {

TEST(ProgressLine, TellsHowFarItIs) {
    const struct {
        uint64_t done;
        uint64_t total;
        const char* text;
    } rows[] = {
            {0, 2048, "reading: 0 of 2048 bytes, 0 %"},
            {512, 2048, "reading: 512 of 2048 bytes, 25 %"},
            {2048, 2048, "reading: 2048 of 2048 bytes, 100 %"},
            {1ull << 62, 1ull << 63,
             "reading: 4611686018427387904 of 9223372036854775808 bytes, 50 %"},
            {512, 0, "reading: 512 bytes"},
    };
    for (const auto& row : rows) {
        EXPECT_EQ(row.text, progressText("reading", row.done, row.total, "bytes"));
    }
}

}  // namespace pemaro::tools
