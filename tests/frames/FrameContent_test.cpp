// SPDX-License-Identifier: Apache-2.0
#include "frames/FrameContent.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cstring>

#include "frames/FrameGenerator.h"

namespace pemaro::frames {

TEST(FrameContent, HasTheFingersAndTheImage) {
    FrameGenerator generator(1000, 2);
    std::vector<uint8_t> frame = generator.draw(7, 123456789, kFilterDefault);
    const FrameContent content = readFrameContent(frame.data());
    EXPECT_EQ(7u, content.header.sequence);
    ASSERT_EQ(2u, content.fingers.size());
    EXPECT_EQ(1, content.fingers[1].id);
    EXPECT_EQ(0, memcmp(&frame[40], content.fingers.data(), 16));
    ASSERT_EQ(size_t{content.header.rows} * content.header.columns, content.image.size());
    EXPECT_EQ(0, memcmp(&frame[56], content.image.data(), frame.size() - 56));
    EXPECT_GT(*std::max_element(content.image.begin(), content.image.end()), 500);
}

TEST(FrameContent, IsEmptyWhereTheFilterLeavesEverythingOut) {
    FrameGenerator generator(1000, 2);
    const FrameContent content = readFrameContent(generator.draw(0, 0, 0).data());
    EXPECT_TRUE(content.fingers.empty());
    EXPECT_TRUE(content.image.empty());
}

}  // namespace pemaro::frames
