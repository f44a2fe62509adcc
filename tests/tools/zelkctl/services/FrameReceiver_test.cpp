// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/services/FrameReceiver.h"

#include <gtest/gtest.h>
#include <sys/mman.h>
#include <unistd.h>

#include <chrono>
#include <vector>

#include "frames/FrameGenerator.h"

using pemaro::frames::FrameGenerator;
using pemaro::frames::kFilterDefault;

namespace pemaro::zelkctl {

namespace {

constexpr uint32_t kPacket = 300;

class FrameReceiverTest : public ::testing::Test {
  protected:
    FrameReceiverTest() { receiver.setPacketSize(kPacket); }

    void give(FrameReceiver& to, uint32_t sequence) {
        std::vector<uint8_t> frame = generator.draw(sequence, 0, frames::kFilterDefault);
        FrameReceiver::onFrame(0, frame.data(), frame.size(), &to);
    }

    // A frame of this length and nothing else, in memory of just that size.
    void giveBytes(size_t announced, size_t present) {
        std::vector<uint8_t> frame(present, 0);
        FrameReceiver::onFrame(0, frame.data(), announced, &receiver);
    }

    frames::FrameGenerator generator{kPacket, 1};
    FrameReceiver receiver{nullptr, 0};
};

bool isDone(FrameReceiver& receiver) {
    return receiver.waitUntilDone(std::chrono::milliseconds(0));
}

}  // namespace

TEST_F(FrameReceiverTest, CountsFramesAndBytes) {
    for (uint32_t i = 0; i < 10; ++i) {
        give(receiver, i);
    }
    const FrameStats stats = receiver.stats();
    EXPECT_EQ(10u, stats.frames);
    EXPECT_EQ(10 * generator.draw(0, 0, frames::kFilterDefault).size(), stats.bytes);
    EXPECT_TRUE(stats.sequenced);
    EXPECT_EQ(0u, stats.gaps + stats.lost + stats.corrupt);
    EXPECT_FALSE(isDone(receiver));
}

TEST_F(FrameReceiverTest, CountsGapsAndWhatIsMissing) {
    const struct {
        std::vector<uint32_t> sequence;
        uint64_t gaps;
        uint64_t lost;
    } rows[] = {
            {{0, 1, 2}, 0, 0}, {{2, 3}, 1, 2},       {{0, 2, 5}, 2, 3},
            {{0, 1, 1}, 1, 0}, {{0, 5, 3, 4}, 2, 4}, {{0xFFFFFFFF}, 1, 0},
    };
    for (const auto& row : rows) {
        FrameReceiver fresh(nullptr, 0);
        fresh.setPacketSize(kPacket);
        for (uint32_t number : row.sequence) {
            give(fresh, number);
        }
        EXPECT_EQ(row.gaps, fresh.stats().gaps);
        EXPECT_EQ(row.lost, fresh.stats().lost);
    }
}

TEST_F(FrameReceiverTest, ReadsNothingOfAFrameWithAnImpossibleLength) {
    for (size_t length : {size_t{0}, size_t{11}, size_t{kPacket + 1}, size_t{0xFFFFFFFF}}) {
        giveBytes(length, 0);
    }
    const FrameStats stats = receiver.stats();
    EXPECT_EQ(0u, stats.frames);
    EXPECT_EQ(4u, stats.corrupt);
    EXPECT_EQ("frame 0 tells a length of 0 bytes, with packets of 300", stats.firstCorrupt);
}

// What a service tells of its packets is its word; the memory may end before.
TEST_F(FrameReceiverTest, KeepsNothingOfAFrameThatEndsOutsideTheMemory) {
    const auto page = static_cast<size_t>(sysconf(_SC_PAGESIZE));
    void* memory =
            mmap(nullptr, 2 * page, PROT_READ | PROT_WRITE, MAP_PRIVATE | MAP_ANONYMOUS, -1, 0);
    ASSERT_NE(MAP_FAILED, memory);
    ASSERT_EQ(0, munmap(static_cast<uint8_t*>(memory) + page, page));
    uint8_t* last = static_cast<uint8_t*>(memory) + page - 100;
    FrameReceiver::onFrame(0, last, 100, &receiver);
    EXPECT_EQ(0u, receiver.stats().corrupt);
    FrameReceiver::onFrame(0, last, 101, &receiver);
    EXPECT_EQ(1u, receiver.stats().corrupt);
    EXPECT_EQ("frame 1 of 101 bytes ends outside the shared memory", receiver.stats().firstCorrupt);
    munmap(memory, page);
}

TEST_F(FrameReceiverTest, SeesATornFrame) {
    std::vector<uint8_t> frame = generator.draw(0, 0, frames::kFilterDefault);
    frame.back() ^= 1;
    give(receiver, 0);
    FrameReceiver::onFrame(0, frame.data(), frame.size(), &receiver);
    EXPECT_EQ(1u, receiver.stats().frames);
    EXPECT_EQ(1u, receiver.stats().corrupt);
    EXPECT_EQ("frame 1: wrong checksum", receiver.stats().firstCorrupt);
}

TEST_F(FrameReceiverTest, TakesFramesOfAnotherKindByTheirLength) {
    giveBytes(12, 12);
    giveBytes(kPacket, kPacket);
    EXPECT_EQ(2u, receiver.stats().frames);
    EXPECT_EQ(312u, receiver.stats().bytes);
    EXPECT_FALSE(receiver.stats().sequenced);
}

TEST_F(FrameReceiverTest, TakesNoMoreThanItsLimit) {
    FrameReceiver limited(nullptr, 3);
    limited.setPacketSize(kPacket);
    for (uint32_t i = 0; i < 5; ++i) {
        EXPECT_EQ(i >= 3, isDone(limited));
        give(limited, i);
    }
    EXPECT_EQ(3u, limited.stats().frames);
}

TEST_F(FrameReceiverTest, IsDoneWhenTheFileTakesNoMore) {
    frames::FrameFile full;
    ASSERT_TRUE(full.open("/dev/full"));
    FrameReceiver writing(&full, 0);
    writing.setPacketSize(kPacket);
    give(writing, 0);
    EXPECT_TRUE(isDone(writing));
    EXPECT_EQ(0u, writing.stats().frames);
}

}  // namespace pemaro::zelkctl
