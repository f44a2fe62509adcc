// SPDX-License-Identifier: Apache-2.0
// The reader's side of the ring: TouchCompanionClient::acquireBuffer() and releaseBuffer().

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <atomic>
#include <cinttypes>
#include <cstdio>
#include <thread>

#include "tests/companion/TouchCompanionClientTest.h"

namespace pemaro::test {
namespace {

using android::sp;
using ::testing::ElementsAre;
using ::testing::IsEmpty;
using FrameBuffer = TouchCompanionClient::FrameBuffer;

std::string dataLine(const FrameBuffer& buffer) {
    char text[100];
    snprintf(text, sizeof(text), "D acquireBuffer: data = %p, size = %zu, frameCount = %u",
             buffer.data, buffer.size, buffer.frameCount);
    return text;
}

class TouchCompanionRing : public TouchCompanionClientTest {
  protected:
    void SetUp() override {
        TouchCompanionClientTest::SetUp();
        mClient = record(mRing);
    }

    // The service has produced `write` frames and the client has consumed `read`.
    void setIndices(uint32_t read, uint32_t write) {
        mRing.setStart(read);
        mRing.cblk().write = write;
    }

    int acquire(size_t bytes) {
        mBuffer = {nullptr, bytes, 99};
        return mClient->acquireBuffer(&mBuffer);
    }

    FrameRing mRing{kBufferFrames, kFrameSize};
    sp<TouchCompanionClient> mClient;
    FakeWaits mWaits;
    FrameBuffer mBuffer = {};
};

// ---- taking frames ----

TEST_F(TouchCompanionRing, TakesTheFramesAskedFor) {
    setIndices(0, 5);
    EXPECT_EQ(0, acquire(3 * kFrameSize));
    EXPECT_EQ(mRing.slot(0), mBuffer.data);
    EXPECT_EQ(3 * kFrameSize, mBuffer.size);
    EXPECT_EQ(3u, mBuffer.frameCount);
    EXPECT_EQ(0u, mRing.cblk().read) << "nothing is consumed before it is released";
    EXPECT_THAT(clientLines(),
                ElementsAre("D acquireBuffer: write = 5, read = 0, reqSize = 3, availaSize = 5",
                            "D acquireBuffer: write = 5, read = 0, reqSize = 3, availSize = 5",
                            "D acquireBuffer: read = 0, bufferEnd = 8",
                            "D acquireBuffer: new reqSize = 3", dataLine(mBuffer)));
    EXPECT_THAT(mWaits.deadlines(), IsEmpty());
}

TEST_F(TouchCompanionRing, TakesWhatThereIsWhenMoreIsAskedFor) {
    setIndices(2, 5);
    EXPECT_EQ(0, acquire(100 * kFrameSize));
    EXPECT_EQ(mRing.slot(2), mBuffer.data);
    EXPECT_EQ(3 * kFrameSize, mBuffer.size);
    EXPECT_EQ(3u, mBuffer.frameCount);
}

TEST_F(TouchCompanionRing, EndsARunAtTheEndOfTheRing) {
    setIndices(5, 12);
    EXPECT_EQ(0, acquire(4 * kFrameSize));
    EXPECT_EQ(mRing.slot(5), mBuffer.data);
    EXPECT_EQ(3 * kFrameSize, mBuffer.size);
    EXPECT_EQ(3u, mBuffer.frameCount);
    EXPECT_THAT(clientLines(),
                ElementsAre("D acquireBuffer: write = 12, read = 5, reqSize = 4, availaSize = 7",
                            "D acquireBuffer: write = 12, read = 5, reqSize = 4, availSize = 7",
                            "D acquireBuffer: read = 5, bufferEnd = 8",
                            "D acquireBuffer: new reqSize = 3", dataLine(mBuffer)));
}

TEST_F(TouchCompanionRing, TakesNoFrameForARequestOfLessThanOne) {
    setIndices(2, 5);
    EXPECT_EQ(0, acquire(kFrameSize - 1));
    EXPECT_EQ(mRing.slot(2), mBuffer.data);
    EXPECT_EQ(0u, mBuffer.size);
    EXPECT_EQ(0u, mBuffer.frameCount);
}

TEST_F(TouchCompanionRing, RoundsARequestDownToWholeFrames) {
    setIndices(2, 5);
    EXPECT_EQ(0, acquire(3 * kFrameSize - 1));
    EXPECT_EQ(2u, mBuffer.frameCount);
}

TEST_F(TouchCompanionRing, CountsRoundsOfTheRing) {
    setIndices(3 * kBufferFrames + 6, 3 * kBufferFrames + 13);
    EXPECT_EQ(0, acquire(100 * kFrameSize));
    EXPECT_EQ(mRing.slot(6), mBuffer.data);
    EXPECT_EQ(2u, mBuffer.frameCount);
    mClient->releaseBuffer(&mBuffer);
    EXPECT_EQ(4u, mRing.cblk().readWrap);

    EXPECT_EQ(0, acquire(100 * kFrameSize));
    EXPECT_EQ(mRing.slot(0), mBuffer.data);
    EXPECT_EQ(5u, mBuffer.frameCount);
}

// The indices count on through 2^32.
TEST_F(TouchCompanionRing, GoesOnWhereTheIndicesWrap) {
    setIndices(0xfffffffe, 1);
    EXPECT_EQ(0, acquire(100 * kFrameSize));
    EXPECT_EQ(mRing.slot(6), mBuffer.data);
    EXPECT_EQ(2u, mBuffer.frameCount) << "2^32 is an end of the ring";
    EXPECT_THAT(
            clientLines(),
            ElementsAre(
                    "D acquireBuffer: write = 1, read = 4294967294, reqSize = 100, availaSize = 3",
                    "D acquireBuffer: write = 1, read = 4294967294, reqSize = 100, availSize = 3",
                    "D acquireBuffer: read = 4294967294, bufferEnd = 0",
                    "D acquireBuffer: new reqSize = 2", dataLine(mBuffer)));
    clearLog();
    mClient->releaseBuffer(&mBuffer);
    EXPECT_EQ(0u, mRing.cblk().read);
    EXPECT_EQ(0x20000000u, mRing.cblk().readWrap);
    EXPECT_THAT(clientLines(), ElementsAre("D releaseBuffer: read = 0, readWrap = 536870912"));

    EXPECT_EQ(0, acquire(100 * kFrameSize));
    EXPECT_EQ(mRing.slot(0), mBuffer.data);
    EXPECT_EQ(1u, mBuffer.frameCount);
}

// ---- releasing ----

TEST_F(TouchCompanionRing, ReleasesTheFramesOfARun) {
    mRing.cblk().read = 3;
    mBuffer.frameCount = 2;
    mClient->releaseBuffer(&mBuffer);
    EXPECT_EQ(5u, mRing.cblk().read);
    EXPECT_EQ(0u, mRing.cblk().readWrap);
    EXPECT_THAT(clientLines(), ElementsAre("D releaseBuffer: read = 5, readWrap = 0"));
}

TEST_F(TouchCompanionRing, CountsARoundOnceWhenARunEndsWithTheRing) {
    mRing.cblk().read = 5;
    mBuffer.frameCount = 3;
    mClient->releaseBuffer(&mBuffer);
    EXPECT_EQ(8u, mRing.cblk().read);
    EXPECT_EQ(1u, mRing.cblk().readWrap);
    EXPECT_THAT(clientLines(), ElementsAre("D releaseBuffer: read = 8, readWrap = 1"));
}

TEST_F(TouchCompanionRing, ReleasesNothingForARunWithoutFrames) {
    mBuffer.frameCount = 0;
    mClient->releaseBuffer(&mBuffer);
    EXPECT_EQ(0u, mRing.cblk().read);
    EXPECT_EQ(0u, mRing.cblk().readWrap) << "although 0 is a multiple of the ring";
    EXPECT_THAT(clientLines(), IsEmpty());
}

TEST_F(TouchCompanionRing, CountsARoundOfARingWithoutFramesAtZeroOnly) {
    mRing.cblk().bufferFrames = 0;
    mRing.cblk().read = 0xfffffffe;
    mBuffer.frameCount = 1;
    mClient->releaseBuffer(&mBuffer);
    EXPECT_EQ(0u, mRing.cblk().readWrap);
    mClient->releaseBuffer(&mBuffer);
    EXPECT_EQ(0u, mRing.cblk().read);
    EXPECT_EQ(1u, mRing.cblk().readWrap);
    EXPECT_THAT(clientLines(), ElementsAre("D releaseBuffer: read = 4294967295, readWrap = 0",
                                           "D releaseBuffer: read = 0, readWrap = 1"));
}

// ---- waiting ----

constexpr char kWaitLine[] = "D acquireBuffer: availaSize = 0, wait for sometime";

TEST_F(TouchCompanionRing, TimesOutAfter63WaitsOnAnEmptyRing) {
    EXPECT_EQ(STATUS_TIMEOUT, acquire(kFrameSize));
    EXPECT_EQ(63u, mWaits.deadlines().size());
    Lines expected = {"D acquireBuffer: write = 0, read = 0, reqSize = 1, availaSize = 0"};
    expected.insert(expected.end(), 63, kWaitLine);
    expected.push_back("E acquireBuffer: totalWaitTime exceeds, TIME_OUT");
    EXPECT_EQ(expected, clientLines());
    EXPECT_EQ(0u, mRing.cblk().read);
}

TEST_F(TouchCompanionRing, WaitsUntilSixteenMillisecondsFromNow) {
    timespec before = {};
    clock_gettime(CLOCK_REALTIME, &before);
    int64_t previous = 0;
    auto nanos = [](const timespec& time) {
        return int64_t{time.tv_sec} * 1000000000 + time.tv_nsec;
    };
    acquire(kFrameSize);
    timespec after = {};
    clock_gettime(CLOCK_REALTIME, &after);
    ASSERT_EQ(63u, mWaits.deadlines().size());
    for (const timespec& deadline : mWaits.deadlines()) {
        EXPECT_GE(nanos(deadline), nanos(before) + 16000000);
        EXPECT_LE(nanos(deadline), nanos(after) + 16000000);
        EXPECT_GE(nanos(deadline), previous) << "each wait has a deadline of its own";
        EXPECT_GE(deadline.tv_nsec, 0);
        EXPECT_LT(deadline.tv_nsec, 1000000000);
        previous = nanos(deadline);
    }
}

TEST_F(TouchCompanionRing, CarriesADeadlineIntoTheNextSecond) {
    timespec before = {};
    for (bool carried = false; !carried;) {
        do {
            usleep(1000);
            clock_gettime(CLOCK_REALTIME, &before);
        } while (before.tv_nsec < 984000000);
        const size_t first = mWaits.deadlines().size();
        acquire(kFrameSize);
        const timespec deadline = mWaits.deadlines()[first];
        carried = deadline.tv_sec == before.tv_sec + 1 && deadline.tv_nsec < 16000000;
        ASSERT_LT(deadline.tv_nsec, 1000000000);
    }
}

// A frame that arrives during a wait is seen at the next look, which one more wait follows.
TEST_F(TouchCompanionRing, ReturnsOneWaitAfterTheOneThatBroughtFrames) {
    mWaits.onWait([&](int number) {
        if (number == 3) {
            mRing.put();
            mRing.put();
        }
    });
    EXPECT_EQ(0, acquire(100 * kFrameSize));
    EXPECT_EQ(4u, mWaits.deadlines().size());
    EXPECT_EQ(2u, mBuffer.frameCount);
    EXPECT_EQ(mRing.slot(0), mBuffer.data);
    EXPECT_THAT(clientLines(),
                ElementsAre("D acquireBuffer: write = 0, read = 0, reqSize = 100, availaSize = 0",
                            kWaitLine, kWaitLine, kWaitLine,
                            "D acquireBuffer: availaSize = 2, wait for sometime",
                            "D acquireBuffer: write = 2, read = 0, reqSize = 100, availSize = 2",
                            "D acquireBuffer: read = 0, bufferEnd = 8",
                            "D acquireBuffer: new reqSize = 2", dataLine(mBuffer)));
}

TEST_F(TouchCompanionRing, CountsTheFramesOfTheLookBeforeTheLastWait) {
    mWaits.onWait([&](int) { mRing.put(); });
    EXPECT_EQ(0, acquire(100 * kFrameSize));
    EXPECT_EQ(2u, mWaits.deadlines().size());
    EXPECT_EQ(2u, mRing.cblk().write);
    EXPECT_EQ(1u, mBuffer.frameCount) << "the second frame came during the last wait";
}

TEST_F(TouchCompanionRing, TakesFramesThatTheWaitBeforeTheLastBrought) {
    mWaits.onWait([&](int number) {
        if (number == 61) mRing.put();
    });
    EXPECT_EQ(0, acquire(kFrameSize));
    EXPECT_EQ(62u, mWaits.deadlines().size());
    EXPECT_EQ(1u, mBuffer.frameCount);
}

TEST_F(TouchCompanionRing, TimesOutAtThe63rdWaitEvenWhenFramesAreThere) {
    mWaits.onWait([&](int number) {
        if (number == 62) mRing.put();
    });
    EXPECT_EQ(STATUS_TIMEOUT, acquire(kFrameSize));
    EXPECT_EQ(63u, mWaits.deadlines().size());
    const Lines lines = clientLines();
    EXPECT_EQ("D acquireBuffer: availaSize = 1, wait for sometime", lines[lines.size() - 2]);
    EXPECT_EQ("E acquireBuffer: totalWaitTime exceeds, TIME_OUT", lines.back());

    EXPECT_EQ(0, acquire(kFrameSize)) << "they are left to the next call";
    EXPECT_EQ(1u, mBuffer.frameCount);
}

// ---- bad blocks ----

TEST_F(TouchCompanionRing, TakesNoFrameOfNoSize) {
    setIndices(2, 5);
    mRing.cblk().frameSize = 0;
    EXPECT_EQ(0, acquire(1000));
    EXPECT_EQ(0u, mBuffer.size);
    EXPECT_EQ(0u, mBuffer.frameCount);
    EXPECT_EQ(mRing.slot(0), mBuffer.data);
    EXPECT_EQ("D acquireBuffer: write = 5, read = 2, reqSize = 0, availaSize = 3",
              clientLines()[0]);
}

// What the arithmetic yields for a ring of no frames; nothing of it is read.
TEST_F(TouchCompanionRing, HasNoEndOfARingWithoutFrames) {
    setIndices(2, 5);
    mRing.cblk().bufferFrames = 0;
    EXPECT_EQ(0, acquire(100 * kFrameSize));
    EXPECT_EQ(3u, mBuffer.frameCount);
    EXPECT_EQ(mRing.slot(2), mBuffer.data);
    EXPECT_EQ("D acquireBuffer: read = 2, bufferEnd = 0", clientLines()[2]);
}

TEST_F(TouchCompanionClientTest, AcquiresNothingWithoutABlock) {
    const sp<TouchCompanionClient> client = connect();
    FrameBuffer buffer = {nullptr, 100, 7};
    EXPECT_EQ(STATUS_INVALID_STATE, client->acquireBuffer(&buffer));
    EXPECT_EQ(7u, buffer.frameCount);
    client->releaseBuffer(&buffer);
    EXPECT_THAT(clientLines(), IsEmpty());
}

// ---- in real time ----

TEST_F(TouchCompanionClientTest, TimesOutAfterAboutASecond) {
    FrameRing ring(kBufferFrames, kFrameSize);
    const sp<TouchCompanionClient> client = record(ring);
    FrameBuffer buffer = {nullptr, kFrameSize, 0};
    const auto before = std::chrono::steady_clock::now();
    EXPECT_EQ(STATUS_TIMEOUT, client->acquireBuffer(&buffer));
    // 63 waits of 16 ms; a wait may end late but not early.
    EXPECT_GE(std::chrono::steady_clock::now() - before, std::chrono::milliseconds(990));
}

// One thread writes as fast as the ring lets it and another reads: no frame is lost, torn or seen twice.
void streamThrough(TouchCompanionClient& client, FrameRing& ring, uint32_t frames) {
    std::atomic<bool> stopped{false};
    std::thread writer([&] {
        for (uint32_t written = 0; written < frames && !stopped;) {
            if (ring.put()) {
                ++written;
            } else {
                standAside();
            }
        }
    });
    const auto giveUp = std::chrono::steady_clock::now() + kPatience;
    uint32_t number = ring.cblk().read;
    uint32_t seen = 0;
    while (seen < frames && std::chrono::steady_clock::now() < giveUp) {
        FrameBuffer buffer = {nullptr, 3 * kFrameSize, 0};
        if (client.acquireBuffer(&buffer) != 0) {
            continue;
        }
        for (uint32_t i = 0; i < buffer.frameCount; ++i) {
            EXPECT_TRUE(ring.holds(static_cast<uint8_t*>(buffer.data) + i * kFrameSize, number++));
        }
        client.releaseBuffer(&buffer);
        seen += buffer.frameCount;
        clearLog();
    }
    EXPECT_EQ(frames, seen);
    stopped = true;
    writer.join();
}

TEST_F(TouchCompanionRing, LosesNoFrameOfAFastWriter) {
    // Without real waits the reader meets an empty ring as often as it can.
    mWaits.onWait([](int) { standAside(); });
    mRing.setStart(0xfffffff0);  // through the wrap of the indices
    streamThrough(*mClient, mRing, 20000);
}

TEST_F(TouchCompanionClientTest, LosesNoFrameWithRealWaits) {
    FrameRing ring(64, kFrameSize);
    const sp<TouchCompanionClient> client = record(ring);
    streamThrough(*client, ring, 1000);
}

}  // namespace
}  // namespace pemaro::test
