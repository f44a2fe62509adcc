// SPDX-License-Identifier: Apache-2.0
#include "simulator/companion/WholeFile.h"

#include <fcntl.h>
#include <gtest/gtest.h>
#include <sys/stat.h>
#include <sys/sysmacros.h>
#include <unistd.h>

#include <filesystem>
#include <string>
#include <vector>

#include "pemaro/Status.h"
#include "tests/support/FolderTest.h"
#include "tests/support/FullDisk.h"

namespace pemaro::simulator {

namespace {

namespace fs = std::filesystem;

constexpr uid_t kNobody = 65534;

class WholeFile : public test::FolderTest {
  protected:
    static struct stat about(const std::string& file) {
        struct stat info {};
        EXPECT_EQ(0, lstat(file.c_str(), &info)) << file;
        return info;
    }
};

}  // namespace

TEST_F(WholeFile, HoldsTheBytesAndNothingElse) {
    EXPECT_EQ(0, writeWholeFile(write("old", "old and longer"), "new"));
    EXPECT_EQ("new", contents(path("old")));
    const mode_t before = umask(027);
    EXPECT_EQ(0, writeWholeFile(path("fresh"), "new"));
    umask(before);
    EXPECT_EQ("new", contents(path("fresh")));
    EXPECT_EQ(0640u, about(path("fresh")).st_mode & 07777);
    EXPECT_EQ(2u, files());
}

TEST_F(WholeFile, IsWrittenWhereALinkLeads) {
    const std::string file = write("file", "old");
    fs::create_symlink("file", path("link"));
    EXPECT_EQ(0, writeWholeFile(path("link"), "new"));
    EXPECT_TRUE(fs::is_symlink(path("link")));
    EXPECT_FALSE(fs::is_symlink(file));
    EXPECT_EQ("new", contents(path("file")));

    fs::create_symlink("nothing", path("dangling"));
    EXPECT_EQ(STATUS_ERROR_OPENING_FILE, writeWholeFile(path("dangling"), "new"));
    EXPECT_TRUE(fs::is_symlink(path("dangling")));
    EXPECT_EQ(3u, files());
}

TEST_F(WholeFile, KeepsOwnerAndPermissions) {
    const bool isRoot = geteuid() == 0;
    for (const mode_t mode : {0600u, 0664u}) {
        const std::string file = write("file", "old");
        ASSERT_EQ(0, chown(file.c_str(), isRoot ? kNobody : getuid(), isRoot ? 1 : getgid()));
        ASSERT_EQ(0, chmod(file.c_str(), mode));
        const struct stat before = about(file);
        EXPECT_EQ(0, writeWholeFile(file, "new"));
        const struct stat after = about(file);
        EXPECT_EQ("new", contents(path("file")));
        EXPECT_EQ(before.st_mode, after.st_mode);
        EXPECT_EQ(before.st_uid, after.st_uid);
        EXPECT_EQ(before.st_gid, after.st_gid);
        EXPECT_NE(before.st_ino, after.st_ino);
        fs::remove(file);
    }
}

TEST_F(WholeFile, StaysItsOwnersWhereOnlyRootCouldMakeItSo) {
    if (geteuid() != 0) {
        GTEST_SKIP() << "only root has two users";
    }
    const std::string file = write("file", "old and longer");
    ASSERT_EQ(0, chmod(file.c_str(), 0666));
    ASSERT_EQ(0, chmod(folder.c_str(), 0777));
    EXPECT_EXIT(_exit(setuid(kNobody) == 0 && writeWholeFile(file, "new") == 0 ? 0 : 1),
                ::testing::ExitedWithCode(0), "");
    EXPECT_EQ("new", contents(path("file")));
    EXPECT_EQ(0u, about(file).st_uid);
    EXPECT_EQ(0666u, about(file).st_mode & 07777);
    ASSERT_EQ(0, chmod(file.c_str(), 0644));
    EXPECT_EXIT(
            _exit(setuid(kNobody) == 0 && writeWholeFile(file, "more") == STATUS_ERROR_OPENING_FILE
                          ? 0
                          : 1),
            ::testing::ExitedWithCode(0), "");
    EXPECT_EQ("new", contents(path("file")));
    EXPECT_EQ(1u, files());
}

TEST_F(WholeFile, LeavesOthersFilesAlone) {
    const std::string file = write("file", "old");
    // Those of another process that had the same number, which has ended, are among them.
    std::vector<std::string> others = {"file.new"};
    for (int i = 1; i <= 100; ++i) {
        others.push_back("file." + std::to_string(getpid()) + "." + std::to_string(i) + ".new");
    }
    for (const std::string& other : others) {
        write(other, "precious");
    }
    EXPECT_EQ(0, writeWholeFile(file, "new"));
    EXPECT_EQ("new", contents(path("file")));
    for (const std::string& other : others) {
        EXPECT_EQ("precious", contents(path(other))) << other;
    }
    EXPECT_EQ(others.size() + 1, files());
}

TEST_F(WholeFile, StaysWhatItWasWhereTheDiskIsFull) {
    const std::string file = write("file", "precious");
    {
        const test::FullDisk full(1000);
        EXPECT_EQ(STATUS_ERROR_WRITING_TO_FILE, writeWholeFile(file, std::string(2000, 'a')));
    }
    EXPECT_EQ("precious", contents(path("file")));
    EXPECT_EQ(1u, files());
}

TEST_F(WholeFile, GoesToAFifoThatIsReadAndWaitsForNobody) {
    const std::string fifo = path("fifo");
    ASSERT_EQ(0, mkfifo(fifo.c_str(), 0600));
    EXPECT_EQ(STATUS_ERROR_OPENING_FILE, writeWholeFile(fifo, "bytes"));
    const int reader = open(fifo.c_str(), O_RDONLY | O_NONBLOCK | O_CLOEXEC);
    ASSERT_GE(reader, 0);
    EXPECT_EQ(0, writeWholeFile(fifo, "bytes"));
    char read[16];
    EXPECT_EQ(5, ::read(reader, read, sizeof(read)));
    // More than it has room for.
    EXPECT_EQ(STATUS_ERROR_WRITING_TO_FILE, writeWholeFile(fifo, std::string(1 << 20, 'a')));
    close(reader);
    EXPECT_TRUE(fs::is_fifo(fifo));
    EXPECT_EQ(1u, files());
}

TEST_F(WholeFile, IsNeverPutInADevicesPlace) {
    // A device of the test's own, as /dev/full is one.
    const std::string device = path("full");
    if (mknod(device.c_str(), S_IFCHR | 0600, makedev(1, 7)) != 0) {
        GTEST_SKIP() << "only root makes devices";
    }
    // Where devices are not to be used it cannot even be opened.
    EXPECT_NE(0, writeWholeFile(device, "bytes"));
    EXPECT_TRUE(fs::is_character_file(device));
    EXPECT_EQ(1u, files());
}

TEST_F(WholeFile, LeavesNothingBehindWhenItCannotBeWritten) {
    const struct {
        std::string path;
        int status;
    } rows[] = {
            {path("none/file"), STATUS_ERROR_OPENING_FILE},
            {write("file", "precious") + "/below", STATUS_ERROR_OPENING_FILE},
            {folder, STATUS_ERROR_OPENING_FILE},
    };
    for (const auto& row : rows) {
        EXPECT_EQ(row.status, writeWholeFile(row.path, "bytes")) << row.path;
    }
    EXPECT_EQ("precious", contents(path("file")));
    EXPECT_EQ(1u, files());
}

}  // namespace pemaro::simulator
