// SPDX-License-Identifier: Apache-2.0
#include "frames/Frame.h"

#include <gtest/gtest.h>

#include <cstring>
#include <string>
#include <vector>

#include "frames/FrameGenerator.h"

namespace pemaro::frames {

namespace {

std::vector<uint8_t> makeFrame() {
    return FrameGenerator(500, 2).draw(7, 1000, kFilterDefault);
}

void setHeader(std::vector<uint8_t>& frame, const FrameHeader& header) {
    memcpy(frame.data(), &header, sizeof(header));
}

FrameHeader headerOf(const std::vector<uint8_t>& frame) {
    FrameHeader header{};
    memcpy(&header, frame.data(), sizeof(header));
    return header;
}

}  // namespace

TEST(FrameFault, IsNoneForAnIntactFrame) {
    const std::vector<uint8_t> frame = makeFrame();
    EXPECT_STREQ(nullptr, frameFault(frame.data(), frame.size()));
}

TEST(FrameFault, SeesEveryFlippedBit) {
    std::vector<uint8_t> frame = makeFrame();
    for (size_t bit = 0; bit < frame.size() * 8; ++bit) {
        frame[bit / 8] ^= static_cast<uint8_t>(1u << bit % 8);
        EXPECT_NE(nullptr, frameFault(frame.data(), frame.size())) << bit;
        frame[bit / 8] ^= static_cast<uint8_t>(1u << bit % 8);
    }
}

TEST(FrameFault, TellsWhatIsWrong) {
    const std::vector<uint8_t> intact = makeFrame();
    EXPECT_STREQ("shorter than its header", frameFault(intact.data(), sizeof(FrameHeader) - 1));
    EXPECT_STREQ("another length than its header tells",
                 frameFault(intact.data(), intact.size() - 1));

    std::vector<uint8_t> frame = intact;
    FrameHeader header = headerOf(intact);
    header.magic += 1;
    setHeader(frame, header);
    EXPECT_STREQ("not a frame of this kind", frameFault(frame.data(), frame.size()));

    header = headerOf(intact);
    header.rows += 1;
    setHeader(frame, header);
    EXPECT_STREQ("another length than its contents", frameFault(frame.data(), frame.size()));

    header = headerOf(intact);
    header.checksum += 1;
    setHeader(frame, header);
    EXPECT_STREQ("wrong checksum", frameFault(frame.data(), frame.size()));
}

TEST(ReadFrameHeader, RefusesOtherKindsOfFrames) {
    const std::vector<uint8_t> frame = makeFrame();
    FrameHeader header{};
    EXPECT_TRUE(readFrameHeader(frame.data(), frame.size(), &header));
    EXPECT_EQ(7u, header.sequence);
    EXPECT_EQ(1000u, header.timeNs);
    EXPECT_FALSE(readFrameHeader(frame.data(), sizeof(header) - 1, &header));
    const std::string other(100, 'x');
    EXPECT_FALSE(readFrameHeader(other.data(), other.size(), &header));
}

}  // namespace pemaro::frames
