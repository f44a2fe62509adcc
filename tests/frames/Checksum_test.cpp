// SPDX-License-Identifier: Apache-2.0
#include "frames/Checksum.h"

#include <gtest/gtest.h>

#include <string>

namespace pemaro::frames {

TEST(Crc32, IsTheOneOfZlib) {
    EXPECT_EQ(0u, crc32("", 0));
    EXPECT_EQ(0xCBF43926u, crc32("123456789", 9));
    EXPECT_EQ(0xCBF43926u, crc32("6789", 4, crc32("12345", 5)));
    EXPECT_EQ(0u, crc32(nullptr, 0));
}

TEST(Crc32, IsContinuedWithoutTheBytes) {
    const std::string bytes = "123456789";
    for (size_t size = 0; size <= bytes.size(); ++size) {
        for (const uint32_t from : {0u, 1u, 0xCBF43926u, 0xFFFFFFFFu}) {
            const uint32_t to = crc32(bytes.data(), size, from);
            EXPECT_EQ(crc32(bytes.data(), size, 77), crc32Over(77, from, to, size)) << size;
        }
    }
}

}  // namespace pemaro::frames
