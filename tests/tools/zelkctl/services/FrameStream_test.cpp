// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/services/FrameStream.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <atomic>
#include <cstring>
#include <thread>
#include <vector>

#include "frames/Frame.h"
#include "frames/FrameGenerator.h"

namespace pemaro::zelkctl {

namespace {

constexpr uint32_t kPacketSize = 4096;

class LatestFrameTest : public ::testing::Test {
  protected:
    LatestFrameTest() { latest.receiver().setPacketSize(kPacketSize); }

    void give(std::vector<uint8_t>& frame) {
        LatestFrame::onFrame(0, frame.data(), frame.size(), &latest);
    }

    frames::FrameGenerator generator{kPacketSize, 2};
    LatestFrame latest;
};

}  // namespace

TEST_F(LatestFrameTest, IsGivenOutOnce) {
    std::vector<uint8_t> first = generator.draw(0, 0, frames::kFilterDefault);
    std::vector<uint8_t> second = generator.draw(1, 0, frames::kFilterDefault);
    std::vector<uint8_t> taken;
    EXPECT_FALSE(latest.take(&taken));
    give(first);
    give(second);
    ASSERT_TRUE(latest.take(&taken));
    EXPECT_EQ(second, taken);
    EXPECT_FALSE(latest.take(&taken));
}

TEST_F(LatestFrameTest, IsIntactAndOfTheKindThatCanBeShown) {
    std::vector<uint8_t> torn = generator.draw(0, 0, frames::kFilterDefault);
    torn.back() ^= 1;
    std::vector<uint8_t> foreign(100, 0);
    std::vector<uint8_t> taken;
    give(torn);
    give(foreign);
    EXPECT_FALSE(latest.take(&taken));
    EXPECT_EQ(1u, latest.receiver().stats().frames);
    EXPECT_EQ(1u, latest.receiver().stats().corrupt);
}

// The frame lies in memory that the service shares. What it tells of its rows there while it is
// being looked at must not become what the copy tells.
TEST_F(LatestFrameTest, StaysIntactWhenTheServiceChangesTheFrameMeanwhile) {
    std::vector<uint8_t> frame = generator.draw(0, 0, frames::kFilterDefault);
    auto* rows = reinterpret_cast<uint16_t*>(frame.data() + offsetof(frames::FrameHeader, rows));
    const uint16_t intact = *rows;
    std::atomic<bool> isOver{false};
    std::thread service([&] {
        while (!isOver) {
            __atomic_store_n(rows, uint16_t{0xFFFF}, __ATOMIC_RELAXED);
            __atomic_store_n(rows, intact, __ATOMIC_RELAXED);
        }
    });
    uint64_t shown = 0;
    uint64_t broken = 0;
    std::vector<uint8_t> taken;
    for (int i = 0; i < 20000; ++i) {
        give(frame);
        if (latest.take(&taken)) {
            shown += 1;
            broken += frames::frameFault(taken.data(), taken.size()) != nullptr ? 1 : 0;
        }
    }
    isOver = true;
    service.join();
    EXPECT_GT(shown, 0u);
    EXPECT_EQ(0u, broken);
    EXPECT_EQ(shown, latest.receiver().stats().frames);
}

}  // namespace pemaro::zelkctl
