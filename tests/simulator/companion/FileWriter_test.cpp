// SPDX-License-Identifier: Apache-2.0
#include "simulator/companion/FileWriter.h"

#include <gtest/gtest.h>
#include <sys/stat.h>
#include <unistd.h>

#include <fstream>
#include <iterator>
#include <string>

namespace pemaro::simulator {

TEST(FileWriter, WritesFramesOneAfterAnother) {
    const std::string path = testing::TempDir() + "FileWriter_test";
    {
        std::ofstream(path) << "what was there before";
        const auto writer = FileWriter::open(path);
        ASSERT_NE(nullptr, writer);
        EXPECT_TRUE(writer->put("one", 3));
        EXPECT_TRUE(writer->put("four", 4));
    }
    std::ifstream file(path);
    EXPECT_EQ("onefour", std::string(std::istreambuf_iterator<char>(file), {}));
    unlink(path.c_str());
}

TEST(FileWriter, RefusesWhatCannotBeOpened) {
    EXPECT_EQ(nullptr, FileWriter::open("/no/such/folder/file"));
    EXPECT_EQ(nullptr, FileWriter::open("/"));
}

TEST(FileWriter, NeverWaitsForTheReaderOfAPipe) {
    const std::string path = testing::TempDir() + "FileWriter_pipe";
    unlink(path.c_str());
    ASSERT_EQ(0, mkfifo(path.c_str(), 0600));
    EXPECT_EQ(nullptr, FileWriter::open(path));
    unlink(path.c_str());
}

TEST(FileWriter, TakesNothingWhenTheDiskIsFull) {
    const auto writer = FileWriter::open("/dev/full");
    ASSERT_NE(nullptr, writer);
    EXPECT_FALSE(writer->put("frame", 5));
}

}  // namespace pemaro::simulator
