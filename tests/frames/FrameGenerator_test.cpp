// SPDX-License-Identifier: Apache-2.0
#include "frames/FrameGenerator.h"

#include <gtest/gtest.h>

#include <cstdlib>
#include <cstring>
#include <vector>

namespace pemaro::frames {

namespace {

struct Picture {
    explicit Picture(const std::vector<uint8_t>& frame) {
        EXPECT_STREQ(nullptr, frameFault(frame.data(), frame.size()));
        memcpy(&header, frame.data(), sizeof(header));
        fingers.resize(header.fingers);
        cells.resize(size_t{header.rows} * header.columns);
        const uint8_t* next = frame.data() + sizeof(header);
        if (!fingers.empty()) {
            memcpy(fingers.data(), next, fingers.size() * sizeof(FingerRecord));
        }
        next += fingers.size() * sizeof(FingerRecord);
        if (!cells.empty()) {
            memcpy(cells.data(), next, cells.size() * sizeof(int16_t));
        }
    }

    int cellAt(const FingerRecord& finger) const {
        const size_t column = (finger.x * (header.columns - 1u) + 32767) / 65535;
        const size_t row = (finger.y * (header.rows - 1u) + 32767) / 65535;
        return cells[row * header.columns + column];
    }

    FrameHeader header;
    std::vector<FingerRecord> fingers;
    std::vector<int16_t> cells;
};

}  // namespace

TEST(FrameGenerator, FillsEverySizeOfPacketAndNoMore) {
    for (uint32_t bytes = sizeof(FrameHeader); bytes < 3000; ++bytes) {
        FrameGenerator generator(bytes, 3);
        const std::vector<uint8_t>& frame = generator.draw(0, 0, kFilterDefault);
        ASSERT_LE(frame.size(), bytes);
        ASSERT_STREQ(nullptr, frameFault(frame.data(), frame.size()));
        // At most a row of the image is missing.
        ASSERT_GT(frame.size() + 2 * 64, bytes);
    }
}

TEST(FrameGenerator, DrawsTheFingersWhereTheyAreTold) {
    FrameGenerator generator(4096, 3);
    for (uint64_t second = 0; second < 20; ++second) {
        const Picture picture(generator.draw(0, second * 1000000000, kFilterDefault));
        ASSERT_EQ(3u, picture.fingers.size());
        for (const FingerRecord& finger : picture.fingers) {
            EXPECT_GT(picture.cellAt(finger), finger.peak / 2) << second;
        }
    }
}

TEST(FrameGenerator, MovesTheFingers) {
    FrameGenerator generator(4096, 1);
    const Picture first(generator.draw(0, 0, kFilterDefault));
    const Picture later(generator.draw(1, 500000000, kFilterDefault));
    EXPECT_GT(abs(first.fingers[0].x - later.fingers[0].x), 1000);
    EXPECT_NE(first.cells, later.cells);
}

TEST(FrameGenerator, DrawsTheSameFrameForTheSameMoment) {
    FrameGenerator one(4096, 3);
    FrameGenerator other(4096, 3);
    EXPECT_EQ(one.draw(5, 123456789, kFilterDefault), other.draw(5, 123456789, kFilterDefault));
}

TEST(FrameGenerator, DrawsNoMoreFingersThanTheHeaderCanCount) {
    constexpr uint32_t kTooMany = 70000;
    FrameGenerator generator(sizeof(FrameHeader) + kTooMany * sizeof(FingerRecord), kTooMany);
    EXPECT_EQ(65535u, Picture(generator.draw(0, 0, kFilterDefault)).fingers.size());
    const std::vector<FingerRecord> fingers(kTooMany, FingerRecord{1, 2, 3, 4});
    EXPECT_EQ(65535u, Picture(generator.draw(0, 0, kFilterDefault, fingers)).fingers.size());
}

TEST(FrameGenerator, LeavesOutWhatTheFilterLeavesOut) {
    FrameGenerator generator(4096, 3);
    struct {
        uint32_t filter;
        bool image;
        bool fingers;
    } const rows[] = {{0, false, false},
                      {kFilterImage, true, false},
                      {kFilterFingers, false, true},
                      {kFilterDefault, true, true},
                      {0xFFFFFFFF, true, true}};
    for (const auto& row : rows) {
        const Picture picture(generator.draw(0, 0, row.filter));
        EXPECT_EQ(row.filter, picture.header.filter);
        EXPECT_EQ(row.image, !picture.cells.empty()) << row.filter;
        EXPECT_EQ(row.fingers, !picture.fingers.empty()) << row.filter;
    }
}

}  // namespace pemaro::frames
