// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/files/ConfigFile.h"

#include <gtest/gtest.h>
#include <stdlib.h>

#include <filesystem>
#include <fstream>
#include <string>

namespace pemaro::zelkctl {

namespace {

namespace fs = std::filesystem;

class ConfigFileTest : public ::testing::Test {
  protected:
    ConfigFileTest() { EXPECT_NE(nullptr, mkdtemp(&folder[0])); }
    ~ConfigFileTest() override { fs::remove_all(folder); }

    std::string path(const std::string& name) const { return folder + "/" + name; }

    std::string write(const std::string& name, const std::string& content) const {
        std::ofstream(path(name), std::ios::binary) << content;
        return path(name);
    }

    std::string folder = testing::TempDir() + "ConfigFile_test.XXXXXX";
};

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
