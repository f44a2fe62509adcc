// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/files/GestureFile.h"

#include <gtest/gtest.h>
#include <unistd.h>

#include <cstring>
#include <fstream>
#include <string>

namespace pemaro::zelkctl {

namespace {

constexpr size_t kRecord = 72144;

class GestureFileTest : public ::testing::Test {
  protected:
    ~GestureFileTest() override { unlink(path.c_str()); }

    std::string readBytes(size_t bytes, size_t limit = 10) {
        std::ofstream(path, std::ios::binary) << std::string(bytes, 'x');
        return readGestures(path, limit, records);
    }

    const std::string path = testing::TempDir() + "GestureFile_test." + std::to_string(getpid());
    std::vector<IGestureManagerClient::GestureData> records;
};

}  // namespace

TEST_F(GestureFileTest, AppendsWholeRecords) {
    std::ofstream(path, std::ios::binary) << std::string(kRecord, 'a') << std::string(kRecord, 'b');
    EXPECT_EQ("", readGestures(path, 10, records));
    EXPECT_EQ("", readGestures(path, 10, records));
    ASSERT_EQ(4u, records.size());
    EXPECT_EQ(std::string(kRecord, 'b'),
              std::string(reinterpret_cast<const char*>(records[3].bytes), kRecord));
}

TEST_F(GestureFileTest, RefusesWhatIsNotWholeRecords) {
    const struct {
        size_t bytes;
        const char* problem;
    } kRows[] = {
            {1, " holds 1 bytes more than whole records of 72144 bytes"},
            {kRecord - 1, " holds 72143 bytes more than whole records of 72144 bytes"},
            {kRecord + 1, " holds 1 bytes more than whole records of 72144 bytes"},
            {0, " is empty"},
    };
    for (const auto& row : kRows) {
        EXPECT_EQ(path + row.problem, readBytes(row.bytes)) << row.bytes;
    }
}

TEST_F(GestureFileTest, RefusesMoreThanTheLimit) {
    EXPECT_EQ("", readBytes(2 * kRecord, 2));
    EXPECT_EQ(path + " makes it more than 2 records of 72144 bytes", readBytes(kRecord, 2));
    records.clear();
    EXPECT_EQ(path + " makes it more than 1 record of 72144 bytes", readBytes(2 * kRecord, 1));
}

TEST_F(GestureFileTest, RefusesWhatCannotBeRead) {
    EXPECT_EQ("cannot open /no/such: No such file or directory",
              readGestures("/no/such", 10, records));
    EXPECT_EQ("cannot read /tmp: Is a directory", readGestures("/tmp", 10, records));
    EXPECT_TRUE(records.empty());
}

}  // namespace pemaro::zelkctl
