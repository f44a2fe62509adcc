// SPDX-License-Identifier: Apache-2.0
#include "frames/Checksum.h"

#include <gtest/gtest.h>

namespace pemaro::frames {

TEST(Crc32, IsTheOneOfZlib) {
    EXPECT_EQ(0u, crc32("", 0));
    EXPECT_EQ(0xCBF43926u, crc32("123456789", 9));
    EXPECT_EQ(0xCBF43926u, crc32("6789", 4, crc32("12345", 5)));
    EXPECT_EQ(0u, crc32(nullptr, 0));
}

}  // namespace pemaro::frames
