// SPDX-License-Identifier: Apache-2.0
#include "simulator/companion/ReplayedFrames.h"

#include <gtest/gtest.h>
#include <unistd.h>

#include <fstream>
#include <string>
#include <vector>

#include "frames/FrameGenerator.h"

using std::chrono::milliseconds;
using std::chrono::nanoseconds;

namespace pemaro::simulator {

namespace {

class ReplayedFramesTest : public ::testing::Test {
  protected:
    ~ReplayedFramesTest() override { unlink(path.c_str()); }

    std::string frame(uint32_t sequence, milliseconds time, uint32_t bytes = 200) {
        frames::FrameGenerator generator(bytes, 1);
        const auto& drawn = generator.draw(
                sequence, static_cast<uint64_t>(nanoseconds(time).count()), frames::kFilterDefault);
        return {drawn.begin(), drawn.end()};
    }

    std::shared_ptr<const Replay> open(const std::string& bytes) {
        std::ofstream(path, std::ios::binary) << bytes;
        return Replay::open(path, &problem);
    }

    /// When the next frame is due in milliseconds, and its bytes.
    static std::pair<double, std::string> take(FrameSource& source) {
        const auto due = source.due();
        EXPECT_TRUE(due);
        const FrameSource::Frame frame = source.next(777, 777, 0);
        const auto* bytes = static_cast<const char*>(frame.bytes);
        return {std::chrono::duration<double, std::milli>(*due).count(),
                std::string(bytes, bytes + frame.length)};
    }

    const std::string path = testing::TempDir() + "ReplayedFrames_test." + std::to_string(getpid());
    std::string problem;
};

}  // namespace

TEST_F(ReplayedFramesTest, AreThoseOfTheRecordingAtItsOwnPace) {
    const std::vector<std::string> frames = {frame(5, milliseconds(1000)),
                                             frame(6, milliseconds(1004), 300),
                                             frame(9, milliseconds(1030))};
    const auto replay = open(frames[0] + frames[1] + frames[2]);
    ASSERT_NE(nullptr, replay) << problem;
    EXPECT_EQ(3u, replay->frames());
    EXPECT_EQ(frames[1].size(), replay->longestFrame());
    EXPECT_EQ(milliseconds(30), replay->duration());
    EXPECT_EQ(0u, replay->leftOut());

    ReplayedFrames source(replay, 1, false);
    EXPECT_TRUE(source.isPaced());
    EXPECT_EQ(std::make_pair(0.0, frames[0]), take(source));
    EXPECT_EQ(std::make_pair(4.0, frames[1]), take(source));
    EXPECT_EQ(std::make_pair(30.0, frames[2]), take(source));
    EXPECT_FALSE(source.due());
}

TEST_F(ReplayedFramesTest, CanBeFasterOrSlowerOrWithoutAPace) {
    const auto replay = open(frame(0, milliseconds(0)) + frame(1, milliseconds(10)));
    ASSERT_NE(nullptr, replay);
    const struct {
        double speed;
        double due;
    } rows[] = {{2, 5}, {0.5, 20}, {1000, 0.01}};
    for (const auto& row : rows) {
        ReplayedFrames source(replay, row.speed, false);
        take(source);
        EXPECT_DOUBLE_EQ(row.due, take(source).first);
    }
    EXPECT_FALSE(ReplayedFrames(replay, 0, false).isPaced());
}

TEST_F(ReplayedFramesTest, BeginAnewInALoop) {
    const std::vector<std::string> frames = {frame(0, milliseconds(0)), frame(1, milliseconds(10)),
                                             frame(2, milliseconds(40))};
    ReplayedFrames source(open(frames[0] + frames[1] + frames[2]), 1, true);
    const double expected[] = {0, 10, 40, 60, 70, 100, 120};
    for (size_t i = 0; i < std::size(expected); ++i) {
        EXPECT_EQ(std::make_pair(expected[i], frames[i % 3]), take(source)) << i;
    }
}

TEST_F(ReplayedFramesTest, DoNotSpinInALoopOfOneFrame) {
    ReplayedFrames source(open(frame(0, milliseconds(7))), 1, true);
    EXPECT_EQ(0, take(source).first);
    EXPECT_EQ(1, take(source).first);
    EXPECT_EQ(2, take(source).first);
}

TEST_F(ReplayedFramesTest, DoNotWaitWhereTimeGoesBack) {
    ReplayedFrames source(open(frame(0, milliseconds(500)) + frame(1, milliseconds(510)) +
                               frame(0, milliseconds(20)) + frame(1, milliseconds(25))),
                          1, false);
    for (const double due : {0, 10, 10, 15}) {
        EXPECT_EQ(due, take(source).first);
    }
}

TEST_F(ReplayedFramesTest, IncludeCorruptOnesWhoseLengthIsKnown) {
    std::vector<std::string> frames = {frame(0, milliseconds(0)), frame(1, milliseconds(5)),
                                       frame(2, milliseconds(10))};
    frames[1][16] ^= 0x40;  // its time, which is not believed
    const auto replay =
            open(frames[0] + frames[1] + frames[2] + frame(3, milliseconds(15)).substr(0, 50));
    ASSERT_NE(nullptr, replay);
    EXPECT_EQ(3u, replay->frames());
    EXPECT_EQ(50u, replay->leftOut());
    ReplayedFrames source(replay, 1, false);
    EXPECT_EQ(std::make_pair(0.0, frames[0]), take(source));
    EXPECT_EQ(std::make_pair(0.0, frames[1]), take(source));
    EXPECT_EQ(std::make_pair(10.0, frames[2]), take(source));
}

TEST_F(ReplayedFramesTest, AreRefusedWhereThereIsNothingToPlay) {
    EXPECT_EQ(nullptr, open(""));
    EXPECT_EQ(path + " has no frame that could be played", problem);
    EXPECT_EQ(nullptr, open("ZT"));
    EXPECT_EQ(path + " has no frame that could be played", problem);
    EXPECT_EQ(nullptr, open("something else"));
    EXPECT_EQ(path + " is no recording of touch frames: it does not begin with one", problem);
}

TEST_F(ReplayedFramesTest, TellHowFarTheyAreReadUntilThatIsGivenUp) {
    const std::string bytes = frame(0, milliseconds(0)) + frame(1, milliseconds(10));
    ASSERT_NE(nullptr, open(bytes));
    size_t told = 0;
    const auto tell = [&](uint64_t done, uint64_t total) {
        told += 1;
        EXPECT_LE(done, total);
        EXPECT_EQ(bytes.size(), total);
        return true;
    };
    EXPECT_NE(nullptr, Replay::open(path, &problem, tell));
    // While frames are looked for, and while they are taken.
    EXPECT_GE(told, 4u);
    for (size_t last = 1; last <= told; ++last) {
        size_t now = 0;
        problem.clear();
        EXPECT_EQ(nullptr, Replay::open(path, &problem, [&](uint64_t, uint64_t) {
                      now += 1;
                      return now < last;
                  }));
        EXPECT_EQ("cannot read " + path + ": that was given up", problem) << last;
    }
}

TEST_F(ReplayedFramesTest, GoOnWhenTheFileIsCutOrWrittenAnew) {
    const std::vector<std::string> frames = {frame(0, milliseconds(0)), frame(1, milliseconds(10))};
    const auto replay = open(frames[0] + frames[1]);
    ASSERT_NE(nullptr, replay) << problem;
    ReplayedFrames source(replay, 1, true);
    EXPECT_EQ(frames[0], take(source).second);
    ASSERT_EQ(0, truncate(path.c_str(), 0));
    EXPECT_EQ(frames[1], take(source).second);
    std::ofstream(path, std::ios::binary) << frame(9, milliseconds(0)) << frame(8, milliseconds(1));
    EXPECT_EQ(frames[0], take(source).second);
    unlink(path.c_str());
    EXPECT_EQ(frames[1], take(source).second);
}

}  // namespace pemaro::simulator
