// SPDX-License-Identifier: Apache-2.0
#include "frames/FrameFile.h"

#include <fcntl.h>
#include <gtest/gtest.h>
#include <sys/stat.h>
#include <unistd.h>

#include <atomic>
#include <fstream>
#include <iterator>
#include <string>
#include <thread>
#include <vector>

#include "tests/support/FullDisk.h"

namespace pemaro::frames {

namespace {

std::string contents(const std::string& path) {
    std::ifstream file(path, std::ios::binary);
    return std::string(std::istreambuf_iterator<char>(file), {});
}

class FrameFileTest : public ::testing::Test {
  protected:
    ~FrameFileTest() override { unlink(path.c_str()); }

    const std::string path = testing::TempDir() + "FrameFile_test." + std::to_string(getpid());
    FrameFile file;
};

}  // namespace

TEST_F(FrameFileTest, KeepsFramesOneAfterAnother) {
    std::ofstream(path) << "what was there before";
    ASSERT_TRUE(file.open(path));
    EXPECT_TRUE(file.write("one", 3));
    EXPECT_TRUE(file.write("four", 4));
    EXPECT_TRUE(file.close());
    EXPECT_EQ("", file.problem());
    EXPECT_EQ("onefour", contents(path));
}

TEST_F(FrameFileTest, AddsToWhatADescriptorLeadsTo) {
    std::ofstream(path) << "old ";
    const int fd = ::open(path.c_str(), O_WRONLY | O_APPEND);
    ASSERT_TRUE(file.open("/proc/self/fd/" + std::to_string(fd)));
    EXPECT_TRUE(file.write("new", 3));
    EXPECT_TRUE(file.close());
    EXPECT_EQ("old new", contents(path));
    EXPECT_EQ(4, ::write(fd, " end", 4));
    EXPECT_EQ("old new end", contents(path));
    ::close(fd);

    FrameFile closed;
    EXPECT_FALSE(closed.open("/proc/self/fd/" + std::to_string(fd)));
    EXPECT_EQ("cannot open /proc/self/fd/" + std::to_string(fd) + ": Bad file descriptor",
              closed.problem());
}

TEST_F(FrameFileTest, TellsWhyItCannotBeOpened) {
    EXPECT_FALSE(file.open("/no/such/folder/file"));
    EXPECT_EQ("cannot open /no/such/folder/file: No such file or directory", file.problem());
    EXPECT_FALSE(file.close());
}

TEST_F(FrameFileTest, LeavesAFileAloneUntilThereIsSomethingToWrite) {
    std::ofstream(path) << "what was there before";
    {
        FrameFile other;
        ASSERT_TRUE(other.open(path));
    }
    EXPECT_EQ("what was there before", contents(path));
    ASSERT_TRUE(file.open(path));
    EXPECT_EQ("what was there before", contents(path));
    EXPECT_TRUE(file.close());
    EXPECT_EQ("", contents(path));
}

TEST_F(FrameFileTest, LeavesNoFileWhenThereWasNothingToWrite) {
    {
        FrameFile other;
        ASSERT_TRUE(other.open(path));
    }
    EXPECT_NE(0, access(path.c_str(), F_OK));
    ASSERT_TRUE(file.open(path));
    EXPECT_TRUE(file.close());
    EXPECT_EQ(0, access(path.c_str(), F_OK));
}

TEST_F(FrameFileTest, HasAFileForItself) {
    const std::string link = path + ".link";
    ASSERT_EQ(0, symlink(path.c_str(), link.c_str()));
    for (const bool isThere : {false, true}) {
        if (isThere) {
            std::ofstream(path) << "old";
        }
        {
            FrameFile first;
            ASSERT_TRUE(first.open(path));
            for (const std::string& name : {path, link}) {
                FrameFile second;
                EXPECT_FALSE(second.open(name));
                EXPECT_EQ("cannot open " + name + ": somebody else is writing to it",
                          second.problem());
                EXPECT_FALSE(second.write("two", 3));
                EXPECT_FALSE(second.close());
            }
            EXPECT_TRUE(first.write("one", 3));
            EXPECT_TRUE(first.close());
        }
        EXPECT_EQ("one", contents(path));
        unlink(path.c_str());
    }
    unlink(link.c_str());

    // Devices are everybody's.
    FrameFile one;
    FrameFile another;
    EXPECT_TRUE(one.open("/dev/null"));
    EXPECT_TRUE(another.open("/dev/null"));
}

TEST_F(FrameFileTest, IsNeverTheOneThatSomebodyElseTakesAwayAgain) {
    std::atomic<bool> mustEnd{false};
    std::thread other([&] {
        while (!mustEnd) {
            FrameFile nothing;
            static_cast<void>(nothing.open(path));
        }
    });
    for (int i = 0; i < 1000; ++i) {
        FrameFile mine;
        if (mine.open(path)) {
            EXPECT_TRUE(mine.write("mine", 4));
            EXPECT_TRUE(mine.close());
            EXPECT_EQ("mine", contents(path)) << i;
            unlink(path.c_str());
        }
    }
    mustEnd = true;
    other.join();
}

TEST_F(FrameFileTest, FollowsALink) {
    const std::string link = path + ".link";
    std::ofstream(path) << "old";
    ASSERT_EQ(0, symlink(path.c_str(), link.c_str()));
    ASSERT_TRUE(file.open(link));
    EXPECT_TRUE(file.write("new", 3));
    EXPECT_TRUE(file.close());
    struct stat info {};
    EXPECT_EQ(0, lstat(link.c_str(), &info));
    EXPECT_TRUE(S_ISLNK(info.st_mode));
    EXPECT_EQ("new", contents(path));
    unlink(link.c_str());
}

TEST_F(FrameFileTest, WaitsForTheReaderOfAFifoUntilItGivesUp) {
    ASSERT_EQ(0, mkfifo(path.c_str(), 0600));
    int asked = 0;
    EXPECT_FALSE(file.open(path, [&asked] { return ++asked == 3; }));
    EXPECT_EQ("cannot open " + path + ": No such device or address", file.problem());

    const int reader = ::open(path.c_str(), O_RDONLY | O_NONBLOCK);
    FrameFile fifo;
    asked = 0;
    ASSERT_TRUE(fifo.open(path, [&asked] { return ++asked == 3; }));
    EXPECT_TRUE(fifo.write("frame", 5));
    EXPECT_FALSE(fifo.isWithinFrame());
    // The pipe is full before all of it is in it, and nobody reads.
    const std::vector<char> large(1 << 20);
    EXPECT_FALSE(fifo.write(large.data(), large.size()));
    EXPECT_TRUE(fifo.isWithinFrame());
    EXPECT_EQ("cannot write " + path + ": Connection timed out, which ends within a frame",
              fifo.problem());
    ::close(reader);
}

TEST_F(FrameFileTest, WritesNothingMoreAfterAFailure) {
    ASSERT_TRUE(file.open("/dev/full"));
    EXPECT_FALSE(file.write("frame", 5));
    EXPECT_EQ("cannot write /dev/full: No space left on device", file.problem());
    EXPECT_FALSE(file.write("frame", 5));
    EXPECT_FALSE(file.close());
}

TEST_F(FrameFileTest, TakesBackAPartOfAFrame) {
    ASSERT_TRUE(file.open(path));
    {
        // The third frame is cut in two.
        const test::FullDisk full(25);
        EXPECT_TRUE(file.write("0123456789", 10));
        EXPECT_TRUE(file.write("abcdefghij", 10));
        EXPECT_FALSE(file.write("ABCDEFGHIJ", 10));
    }
    EXPECT_EQ("cannot write " + path + ": File too large", file.problem());
    EXPECT_EQ("0123456789abcdefghij", contents(path));
}

}  // namespace pemaro::frames
