// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/files/ConfigFile.h"

#include <gtest/gtest.h>
#include <stdlib.h>
#include <sys/stat.h>

#include <filesystem>
#include <fstream>
#include <iterator>
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

    static std::string contents(const std::string& file) {
        std::ifstream stream(file, std::ios::binary);
        return {std::istreambuf_iterator<char>(stream), {}};
    }

    size_t files() const {
        return static_cast<size_t>(
                std::distance(fs::directory_iterator(folder), fs::directory_iterator()));
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

TEST_F(ConfigFileTest, IsReplacedByTheBytesGiven) {
    const std::string file = write("config", "old and longer");
    const std::string content("n\0w", 3);
    EXPECT_TRUE(writeConfigFile(file, content).isGood());
    EXPECT_EQ(content, contents(file));
    EXPECT_TRUE(writeConfigFile(path("fresh"), "").isGood());
    EXPECT_EQ("", contents(path("fresh")));
    EXPECT_EQ(2u, files());
}

TEST_F(ConfigFileTest, IsReplacedWhereALinkLeadsAndKeepsWhoMayReadIt) {
    const std::string file = write("config", "old");
    fs::permissions(file, fs::perms::owner_read | fs::perms::owner_write);
    fs::create_symlink(file, path("link"));
    EXPECT_TRUE(writeConfigFile(path("link"), "new").isGood());
    EXPECT_TRUE(fs::is_symlink(path("link")));
    EXPECT_EQ("new", contents(file));
    EXPECT_EQ(fs::perms::owner_read | fs::perms::owner_write, fs::status(file).permissions());

    fs::create_symlink(path("nothing"), path("dangling"));
    const FileResult result = writeConfigFile(path("dangling"), "new");
    EXPECT_EQ(STATUS_ERROR_OPENING_FILE, result.status);
    EXPECT_EQ(path("dangling") + " is a link to nothing", result.detail);
}

TEST_F(ConfigFileTest, IsNeverPutInADevicesPlace) {
    EXPECT_TRUE(writeConfigFile("/dev/null", "bytes").isGood());
    EXPECT_TRUE(fs::is_character_file("/dev/null"));
    const FileResult full = writeConfigFile("/dev/full", "bytes");
    EXPECT_EQ(STATUS_ERROR_WRITING_TO_FILE, full.status);
    EXPECT_EQ("/dev/full: No space left on device", full.detail);
    EXPECT_TRUE(fs::is_character_file("/dev/full"));
}

TEST_F(ConfigFileTest, LeavesNothingBehindWhenItCannotBeWritten) {
    const struct {
        std::string path;
        int status;
        std::string detail;
    } rows[] = {
            {path("none/config"), STATUS_ERROR_OPENING_FILE, ": No such file or directory"},
            {folder, STATUS_ERROR_OPENING_FILE, ": Is a directory"},
    };
    for (const auto& row : rows) {
        const FileResult result = writeConfigFile(row.path, "bytes");
        EXPECT_EQ(row.status, result.status) << row.path;
        EXPECT_EQ(row.path + row.detail, result.detail);
    }
    EXPECT_EQ(0u, files());
    for (const auto& entry : fs::directory_iterator(fs::path(folder).parent_path())) {
        EXPECT_NE(0u, entry.path().string().find(folder + ".")) << entry;
    }
}

}  // namespace pemaro::zelkctl
