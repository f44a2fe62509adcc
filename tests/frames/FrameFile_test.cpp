// SPDX-License-Identifier: Apache-2.0
#include "frames/FrameFile.h"

#include <gtest/gtest.h>
#include <sys/resource.h>
#include <unistd.h>

#include <csignal>
#include <fstream>
#include <iterator>
#include <string>

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

TEST_F(FrameFileTest, TellsWhyItCannotBeOpened) {
    EXPECT_FALSE(file.open("/no/such/folder/file"));
    EXPECT_EQ("cannot open /no/such/folder/file: No such file or directory", file.problem());
    EXPECT_FALSE(file.close());
}

TEST_F(FrameFileTest, WritesNothingMoreAfterAFailure) {
    ASSERT_TRUE(file.open("/dev/full"));
    EXPECT_FALSE(file.write("frame", 5));
    EXPECT_EQ("cannot write /dev/full: No space left on device", file.problem());
    EXPECT_FALSE(file.write("frame", 5));
    EXPECT_FALSE(file.close());
}

TEST_F(FrameFileTest, TakesBackAPartOfAFrame) {
    // A limit on the file's size cuts the third frame in two, as a full disk does.
    signal(SIGXFSZ, SIG_IGN);
    rlimit before{};
    ASSERT_EQ(0, getrlimit(RLIMIT_FSIZE, &before));
    rlimit limit = before;
    limit.rlim_cur = 25;
    ASSERT_TRUE(file.open(path));
    ASSERT_EQ(0, setrlimit(RLIMIT_FSIZE, &limit));
    EXPECT_TRUE(file.write("0123456789", 10));
    EXPECT_TRUE(file.write("abcdefghij", 10));
    EXPECT_FALSE(file.write("ABCDEFGHIJ", 10));
    ASSERT_EQ(0, setrlimit(RLIMIT_FSIZE, &before));
    EXPECT_EQ("cannot write " + path + ": File too large", file.problem());
    EXPECT_EQ("0123456789abcdefghij", contents(path));
}

}  // namespace pemaro::frames
