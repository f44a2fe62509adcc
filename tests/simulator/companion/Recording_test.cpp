// SPDX-License-Identifier: Apache-2.0
#include "simulator/companion/Recording.h"

#include <gtest/gtest.h>

#include <chrono>
#include <condition_variable>
#include <cstring>
#include <memory>
#include <mutex>
#include <thread>
#include <vector>

#include "simulator/companion/GeneratedFrames.h"

namespace pemaro::simulator {

namespace {

// Notes the frames that it takes; has room as long as the test wants.
class NotingSink : public FrameSink {
  public:
    explicit NotingSink(int room) : mRoom(room) {}

    bool put(const void* frame, size_t length) override {
        std::lock_guard<std::mutex> guard(mLock);
        mOffers += 1;
        mChanged.notify_all();
        if (mRoom == 0) {
            return false;
        }
        mRoom -= 1;
        EXPECT_STREQ(nullptr, frames::frameFault(frame, length));
        frames::FrameHeader header{};
        memcpy(&header, frame, sizeof(header));
        mFrames.push_back(header);
        mChanged.notify_all();
        return true;
    }

    void makeRoom(int frames) {
        std::lock_guard<std::mutex> guard(mLock);
        mRoom += frames;
    }

    void awaitOffers(uint64_t count) {
        std::unique_lock<std::mutex> guard(mLock);
        mChanged.wait(guard, [this, count] { return mOffers >= count; });
    }

    void awaitFrames(size_t count) {
        std::unique_lock<std::mutex> guard(mLock);
        mChanged.wait(guard, [this, count] { return mFrames.size() >= count; });
    }

    // Takes frames without having them taken from it.
    bool remind() override {
        std::lock_guard<std::mutex> guard(mLock);
        mReminders += 1;
        mChanged.notify_all();
        return true;
    }

    uint64_t reminders() const {
        std::lock_guard<std::mutex> guard(mLock);
        return mReminders;
    }

    void awaitReminders(uint64_t count) {
        std::unique_lock<std::mutex> guard(mLock);
        mChanged.wait(guard, [this, count] { return mReminders >= count; });
    }

    std::vector<frames::FrameHeader> frames() const {
        std::lock_guard<std::mutex> guard(mLock);
        return mFrames;
    }

  private:
    mutable std::mutex mLock;
    std::condition_variable mChanged;
    int mRoom;
    uint64_t mOffers = 0;
    uint64_t mReminders = 0;
    std::vector<frames::FrameHeader> mFrames;
};

std::unique_ptr<FrameSource> drawnFrames(double rate) {
    return std::make_unique<GeneratedFrames>(frames::FrameGenerator(200, 1), rate);
}

struct RunningRecording {
    explicit RunningRecording(double rate, int room = 1000000,
                              std::chrono::microseconds remindAfter = {})
            : sink(std::make_shared<NotingSink>(room)),
              filter(std::make_shared<std::atomic<uint32_t>>(frames::kFilterDefault)),
              recording(sink, drawnFrames(rate), filter, remindAfter) {}

    const std::shared_ptr<NotingSink> sink;
    const std::shared_ptr<std::atomic<uint32_t>> filter;
    Recording recording;
};

}  // namespace

TEST(Recording, NumbersItsFramesFromZero) {
    RunningRecording running(2000);
    running.sink->awaitOffers(20);
    const Recording::Counts counts = running.recording.stop();
    const std::vector<frames::FrameHeader> frames = running.sink->frames();
    EXPECT_EQ(counts.produced, frames.size());
    EXPECT_EQ(0u, counts.dropped);
    for (size_t i = 0; i < frames.size(); ++i) {
        EXPECT_EQ(i, frames[i].sequence);
        EXPECT_GE(frames[i].timeNs, frames[i == 0 ? 0 : i - 1].timeNs);
    }
}

TEST(Recording, CountsADroppedFrameAndLeavesItsNumberOut) {
    RunningRecording running(2000, 3);
    running.sink->awaitOffers(30);
    running.sink->makeRoom(1);
    running.sink->awaitFrames(4);
    const Recording::Counts counts = running.recording.stop();
    const std::vector<frames::FrameHeader> frames = running.sink->frames();
    ASSERT_EQ(4u, frames.size());
    EXPECT_EQ(counts.produced, counts.dropped + 4);
    EXPECT_GT(frames[3].sequence, 4u);
}

TEST(Recording, RemindsOfAFrameThatIsNotTaken) {
    // One frame, and the next one not within this test.
    RunningRecording running(0.001, 1000000, std::chrono::microseconds(100));
    running.sink->awaitReminders(5);
    running.recording.stop();
    EXPECT_EQ(1u, running.sink->frames().size());
}

TEST(Recording, RemindsOfNothingUnlessTold) {
    RunningRecording running(2000);
    running.sink->awaitOffers(20);
    running.recording.stop();
    EXPECT_EQ(0u, running.sink->reminders());
}

TEST(Recording, WithoutAPaceDropsNothing) {
    RunningRecording running(0, 0);
    for (int i = 0; i < 20; ++i) {
        running.sink->makeRoom(3);
        std::this_thread::sleep_for(std::chrono::milliseconds(2));
    }
    const Recording::Counts counts = running.recording.stop();
    const std::vector<frames::FrameHeader> frames = running.sink->frames();
    EXPECT_EQ(0u, counts.dropped);
    EXPECT_EQ(counts.produced, frames.size());
    for (size_t i = 0; i < frames.size(); ++i) {
        EXPECT_EQ(i, frames[i].sequence);
    }
}

TEST(Recording, FollowsTheFilterWhileItRuns) {
    RunningRecording running(2000);
    running.sink->awaitOffers(5);
    *running.filter = 0;
    running.sink->awaitOffers(500);
    running.recording.stop();
    EXPECT_EQ(frames::kFilterDefault, running.sink->frames().front().filter);
    EXPECT_EQ(0u, running.sink->frames().back().filter);
}

TEST(Recording, TellsTheSameAfterEachStop) {
    RunningRecording running(2000);
    running.sink->awaitOffers(1);
    const Recording::Counts counts = running.recording.stop();
    EXPECT_EQ(counts.produced, running.recording.stop().produced);
}

TEST(Recording, AbandonsAThreadThatIsStuck) {
    // A sink that blocks for good, as a condition does that a dead reader left behind.
    class StuckSink : public FrameSink {
      public:
        bool put(const void*, size_t) override {
            std::unique_lock<std::mutex> guard(mLock);
            mReached = true;
            mChanged.notify_all();
            mChanged.wait(guard, [this] { return mReleased; });
            return true;
        }
        void awaitReached() {
            std::unique_lock<std::mutex> guard(mLock);
            mChanged.wait(guard, [this] { return mReached; });
        }
        void release() {
            std::lock_guard<std::mutex> guard(mLock);
            mReleased = true;
            mChanged.notify_all();
        }

      private:
        std::mutex mLock;
        std::condition_variable mChanged;
        bool mReached = false;
        bool mReleased = false;
    };
    const auto sink = std::make_shared<StuckSink>();
    {
        Recording recording(sink, drawnFrames(100), std::make_shared<std::atomic<uint32_t>>(0));
        sink->awaitReached();
    }
    sink->release();
    // The thread, free again, lets go of the sink.
    while (sink.use_count() > 1) {
        std::this_thread::sleep_for(std::chrono::milliseconds(1));
    }
}

}  // namespace pemaro::simulator
