// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/files/OutputFile.h"

#include <gtest/gtest.h>
#include <stdlib.h>
#include <sys/resource.h>
#include <sys/stat.h>

#include <csignal>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <string>
#include <thread>

namespace pemaro::zelkctl {

namespace {

namespace fs = std::filesystem;

class OutputFileTest : public ::testing::Test {
  protected:
    OutputFileTest() { EXPECT_NE(nullptr, mkdtemp(&folder[0])); }
    ~OutputFileTest() override { fs::remove_all(folder); }

    std::string path(const std::string& name) const { return folder + "/" + name; }

    std::string write(const std::string& name, const std::string& content) const {
        std::ofstream(path(name), std::ios::binary) << content;
        return path(name);
    }

    // Makes a whole of these bytes.
    static FileResult make(const std::string& path, const std::string& bytes) {
        OutputFile file;
        static_cast<void>(file.open(path) && file.write(bytes) && file.close());
        return file.result();
    }

    static std::string contents(const std::string& file) {
        std::ifstream stream(file, std::ios::binary);
        return {std::istreambuf_iterator<char>(stream), {}};
    }

    size_t files() const {
        return static_cast<size_t>(
                std::distance(fs::directory_iterator(folder), fs::directory_iterator()));
    }

    std::string folder = testing::TempDir() + "OutputFile_test.XXXXXX";
};

}  // namespace

TEST_F(OutputFileTest, IsReplacedByTheBytesGiven) {
    const std::string file = write("config", "old and longer");
    const std::string content("n\0w", 3);
    EXPECT_TRUE(make(file, content).isGood());
    EXPECT_EQ(content, contents(file));
    EXPECT_TRUE(make(path("fresh"), "").isGood());
    EXPECT_EQ("", contents(path("fresh")));
    EXPECT_EQ(2u, files());
}

TEST_F(OutputFileTest, IsReplacedWhereALinkLeadsAndKeepsWhoMayReadIt) {
    const std::string file = write("config", "old");
    fs::permissions(file, fs::perms::owner_read | fs::perms::owner_write);
    fs::create_symlink(file, path("link"));
    EXPECT_TRUE(make(path("link"), "new").isGood());
    EXPECT_TRUE(fs::is_symlink(path("link")));
    EXPECT_EQ("new", contents(file));
    EXPECT_EQ(fs::perms::owner_read | fs::perms::owner_write, fs::status(file).permissions());

    fs::create_symlink(path("nothing"), path("dangling"));
    const FileResult result = make(path("dangling"), "new");
    EXPECT_EQ(STATUS_ERROR_OPENING_FILE, result.status);
    EXPECT_EQ(path("dangling") + ": it is a link to nothing", result.detail);
}

TEST_F(OutputFileTest, LeavesWhatIsThereAloneUntilItIsWhole) {
    const std::string kept = write("file", "precious");
    {
        OutputFile given;
        ASSERT_TRUE(given.open(kept));
        EXPECT_TRUE(given.write(std::string(1 << 20, 'a')));
        EXPECT_EQ("precious", contents(kept));
        EXPECT_EQ(2u, files());
    }
    EXPECT_EQ("precious", contents(kept));
    EXPECT_EQ(1u, files());

    OutputFile file;
    ASSERT_TRUE(file.open(kept));
    EXPECT_TRUE(file.write("one "));
    EXPECT_TRUE(file.write("two"));
    EXPECT_TRUE(file.close());
    EXPECT_EQ("", file.problem());
    EXPECT_EQ("one two", contents(kept));
    EXPECT_EQ(1u, files());
}

TEST_F(OutputFileTest, IsNotMadeWhereTheDiskIsFull) {
    // A limit on the size of files, as a full disk is one.
    const std::string kept = write("file", "precious");
    signal(SIGXFSZ, SIG_IGN);
    rlimit before{};
    ASSERT_EQ(0, getrlimit(RLIMIT_FSIZE, &before));
    rlimit limit = before;
    limit.rlim_cur = 1000;
    ASSERT_EQ(0, setrlimit(RLIMIT_FSIZE, &limit));
    {
        OutputFile file;
        EXPECT_TRUE(file.open(kept));
        EXPECT_TRUE(file.write(std::string(2000, 'a')));
        EXPECT_FALSE(file.close());
        EXPECT_EQ("cannot write " + kept + ": File too large", file.problem());
        EXPECT_FALSE(file.write("more"));
    }
    ASSERT_EQ(0, setrlimit(RLIMIT_FSIZE, &before));
    EXPECT_EQ("precious", contents(kept));
    EXPECT_EQ(1u, files());
}

TEST_F(OutputFileTest, GoesThroughAFifo) {
    ASSERT_EQ(0, mkfifo(path("fifo").c_str(), 0600));
    std::string read;
    std::thread reader([&] { read = contents(path("fifo")); });
    const std::string bytes(200000, 'a');
    EXPECT_TRUE(make(path("fifo"), bytes).isGood());
    reader.join();
    EXPECT_EQ(bytes, read);
    EXPECT_TRUE(fs::is_fifo(path("fifo")));
}

TEST_F(OutputFileTest, IsNeverPutInADevicesPlace) {
    EXPECT_TRUE(make("/dev/null", "bytes").isGood());
    EXPECT_TRUE(fs::is_character_file("/dev/null"));
    const FileResult full = make("/dev/full", "bytes");
    EXPECT_EQ(STATUS_ERROR_WRITING_TO_FILE, full.status);
    EXPECT_EQ("/dev/full: No space left on device", full.detail);
    EXPECT_TRUE(fs::is_character_file("/dev/full"));
}

TEST_F(OutputFileTest, LeavesNothingBehindWhenItCannotBeWritten) {
    const struct {
        std::string path;
        int status;
        std::string detail;
    } rows[] = {
            {path("none/config"), STATUS_ERROR_OPENING_FILE, ": No such file or directory"},
            {folder, STATUS_ERROR_OPENING_FILE, ": Is a directory"},
    };
    for (const auto& row : rows) {
        const FileResult result = make(row.path, "bytes");
        EXPECT_EQ(row.status, result.status) << row.path;
        EXPECT_EQ(row.path + row.detail, result.detail);
    }
    EXPECT_EQ(0u, files());
    for (const auto& entry : fs::directory_iterator(fs::path(folder).parent_path())) {
        EXPECT_NE(0u, entry.path().string().find(folder + ".")) << entry;
    }
}

}  // namespace pemaro::zelkctl
