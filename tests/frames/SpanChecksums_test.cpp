// SPDX-License-Identifier: Apache-2.0
#include "frames/SpanChecksums.h"

#include <gtest/gtest.h>

#include <random>
#include <string>

#include "frames/Checksum.h"

namespace pemaro::frames {

namespace {

constexpr uint64_t kBlock = SpanChecksums::kBlockBytes;
constexpr uint64_t kSize = 50 * kBlock + 17;

class SpanChecksumsTest : public ::testing::Test {
  protected:
    SpanChecksumsTest() {
        for (char& byte : bytes) {
            byte = static_cast<char>(random());
        }
    }

    bool read(uint64_t begin, uint64_t end, uint32_t* crc) {
        EXPECT_LE(begin, end);
        EXPECT_LE(end - begin, kBlock);
        hasRead += end - begin;
        *crc = crc32(&bytes[begin], end - begin, *crc);
        return end <= readable;
    }

    void expectSum(uint64_t begin, uint64_t end) {
        uint32_t crc = 0x1234567;
        ASSERT_TRUE(checksums.add(begin, end, &crc));
        EXPECT_EQ(crc32(&bytes[begin], end - begin, 0x1234567), crc) << begin << " " << end;
    }

    uint64_t upTo(uint64_t limit) {
        return std::uniform_int_distribution<uint64_t>(0, limit)(random);
    }

    std::mt19937 random{1};
    std::string bytes = std::string(kSize, '\0');
    uint64_t readable = kSize;
    uint64_t hasRead = 0;
    SpanChecksums checksums{
            [this](uint64_t begin, uint64_t end, uint32_t* crc) { return read(begin, end, crc); }};
};

}  // namespace

TEST_F(SpanChecksumsTest, AreThoseOfTheBytes) {
    for (int i = 0; i < 2000; ++i) {
        const uint64_t begin = upTo(kSize);
        expectSum(begin, begin + upTo(kSize - begin));
    }
}

TEST_F(SpanChecksumsTest, AreThoseOfTheBytesAtTheEdgesOfBlocks) {
    for (uint64_t begin = 0; begin < 3 * kBlock; begin += kBlock / 2) {
        for (const uint64_t length :
             {uint64_t{0}, uint64_t{1}, kBlock - 1, kBlock, kBlock + 1, 3 * kBlock}) {
            expectSum(begin, begin + length);
        }
    }
}

TEST_F(SpanChecksumsTest, ReadLittleMoreThanTheWholeForSpansThatOverlap) {
    constexpr uint64_t kSpans = 500;
    for (uint64_t begin = 0; begin < kSpans; ++begin) {
        expectSum(begin, kSize / 2 + upTo(kSize / 2));
    }
    EXPECT_LT(hasRead, kSize + kSpans * 2 * kBlock);
}

TEST_F(SpanChecksumsTest, ReadNothingElseForSpansThatFollowEachOther) {
    for (uint64_t begin = 0; begin + 9000 <= kSize; begin += 9000) {
        expectSum(begin + 40, begin + 9000);
    }
    EXPECT_EQ(kSize / 9000 * (9000 - 40), hasRead);
}

TEST_F(SpanChecksumsTest, TellWhenTheBytesCannotBeRead) {
    readable = 3 * kBlock;
    uint32_t crc = 0;
    EXPECT_FALSE(checksums.add(0, readable + 1, &crc));
}

}  // namespace pemaro::frames
