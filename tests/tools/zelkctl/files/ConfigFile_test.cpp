// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/files/ConfigFile.h"

#include <gtest/gtest.h>

#include <string>

#include "tests/support/FolderTest.h"

namespace pemaro::zelkctl {

namespace {

using ConfigFileTest = test::FolderTest;

}  // namespace

TEST_F(ConfigFileTest, IsReadWhole) {
    const std::string content("a\0b\n\xFF", 5);
    std::string bytes;
    EXPECT_TRUE(readConfigFile(write("config", content), 5, bytes).isGood());
    EXPECT_EQ(content, bytes);
    EXPECT_TRUE(readConfigFile(write("empty", ""), 5, bytes).isGood());
    EXPECT_EQ("", bytes);
}

TEST_F(ConfigFileTest, IsRefusedWhenItCannotBeReadOrIsTooLarge) {
    const struct {
        std::string path;
        int status;
        std::string detail;
    } rows[] = {
            {path("none"), STATUS_ERROR_OPENING_FILE, ": No such file or directory"},
            {folder, STATUS_ERROR_READING_FILE, ": Is a directory"},
            {write("large", "123456"), STATUS_DATA_EXCEEDS_BUFFER,
             " has more than 5 bytes, the most that a transaction carries"},
            {"/dev/zero", STATUS_DATA_EXCEEDS_BUFFER,
             " has more than 5 bytes, the most that a transaction carries"},
    };
    for (const auto& row : rows) {
        std::string bytes;
        const FileResult result = readConfigFile(row.path, 5, bytes);
        EXPECT_EQ(row.status, result.status) << row.path;
        EXPECT_EQ(row.path + row.detail, result.detail);
    }
}

}  // namespace pemaro::zelkctl
