// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/files/OutputFile.h"

#include <android-base/unique_fd.h>
#include <fcntl.h>
#include <grp.h>
#include <gtest/gtest.h>
#include <sched.h>
#include <stdlib.h>
#include <sys/mount.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

#include <filesystem>
#include <fstream>
#include <iterator>
#include <string>
#include <thread>

#include "tests/support/FolderTest.h"
#include "tests/support/FullDisk.h"

namespace pemaro::zelkctl {

namespace {

namespace fs = std::filesystem;

class OutputFileTest : public test::FolderTest {
  protected:
    // Makes a whole of these bytes.
    static FileResult make(const std::string& path, const std::string& bytes) {
        OutputFile file;
        static_cast<void>(file.open(path) && file.write(bytes) && file.close());
        return file.result();
    }

    // What a process of its own makes of it: 0 for true.
    template <typename Body>
    static int inChild(Body body) {
        const pid_t child = fork();
        if (child == 0) {
            _exit(body() ? 0 : 1);
        }
        int status = -1;
        return waitpid(child, &status, 0) == child && WIFEXITED(status) ? WEXITSTATUS(status) : -1;
    }

    // Root may write everywhere; whoever else runs this stays who he is.
    static void becomeNobody() {
        constexpr id_t kNobody = 65534;
        if (geteuid() == 0 &&
            (setgroups(0, nullptr) != 0 || setgid(kNobody) != 0 || setuid(kNobody) != 0)) {
            _exit(2);
        }
    }
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

TEST_F(OutputFileTest, RefusesTheFileThatIsRead) {
    const std::string file = write("file", "precious");
    fs::create_symlink(file, path("link"));
    fs::create_hard_link(file, path("other"));
    const android::base::unique_fd input(::open(file.c_str(), O_RDONLY));
    const android::base::unique_fd output(::open(file.c_str(), O_WRONLY | O_APPEND));
    const std::string descriptor = "/proc/self/fd/" + std::to_string(output.get());
    for (const std::string& name : {file, path("link"), path("other"), descriptor}) {
        OutputFile same;
        EXPECT_FALSE(same.open(name, input.get())) << name;
        EXPECT_EQ("cannot write " + name + ": it is the file that is read", same.problem());
        EXPECT_FALSE(same.write("bytes"));
        EXPECT_FALSE(same.close());
    }
    EXPECT_EQ("precious", contents(file));
    EXPECT_EQ(3u, files());
    OutputFile another;
    EXPECT_TRUE(another.open(path("fresh"), input.get()));
    // A device is as good to be read as to be written to.
    const android::base::unique_fd null(::open("/dev/null", O_RDONLY));
    OutputFile device;
    EXPECT_TRUE(device.open("/dev/null", null.get()));
}

TEST_F(OutputFileTest, IsAddedToThroughADescriptor) {
    const std::string file = write("file", "old ");
    const android::base::unique_fd appending(::open(file.c_str(), O_WRONLY | O_APPEND));
    const std::string descriptor = "/proc/self/fd/" + std::to_string(appending.get());
    EXPECT_TRUE(make(descriptor, "new").isGood());
    EXPECT_EQ("old new", contents(file));
    fs::create_symlink(descriptor, path("link"));
    EXPECT_TRUE(make(path("link"), ", newer").isGood());
    EXPECT_EQ(2, ::write(appending.get(), "; ", 2));
    EXPECT_EQ("old new, newer; ", contents(file));
    const android::base::unique_fd within(::open(file.c_str(), O_WRONLY));
    EXPECT_EQ(4, lseek(within.get(), 4, SEEK_SET));
    EXPECT_TRUE(make("/proc/self/fd/" + std::to_string(within.get()), "NEW").isGood());
    EXPECT_EQ("old NEW, newer; ", contents(file));
    EXPECT_EQ(2u, files());

    const FileResult closed = make("/proc/self/fd/123456", "bytes");
    EXPECT_EQ(STATUS_ERROR_OPENING_FILE, closed.status);
    EXPECT_EQ("/proc/self/fd/123456: Bad file descriptor", closed.detail);
}

TEST_F(OutputFileTest, KeepsItsOwner) {
    if (geteuid() != 0) {
        GTEST_SKIP() << "a file can be given away by root alone";
    }
    const std::string file = write("file", "old");
    ASSERT_EQ(0, chown(file.c_str(), 1000, 1001));
    ASSERT_EQ(0, chmod(file.c_str(), 0640));
    EXPECT_TRUE(make(file, "new").isGood());
    EXPECT_EQ("new", contents(file));
    struct stat info {};
    ASSERT_EQ(0, stat(file.c_str(), &info));
    EXPECT_EQ(1000u, info.st_uid);
    EXPECT_EQ(1001u, info.st_gid);
    EXPECT_EQ(0640u, info.st_mode & 07777);
}

TEST_F(OutputFileTest, HidesWhatIsNotCompleteFromWhoeverMayNotReadTheOldOne) {
    const std::string file = write("file", "old");
    ASSERT_EQ(0, chmod(file.c_str(), 0600));
    OutputFile output;
    ASSERT_TRUE(output.open(file));
    for (const auto& entry : fs::directory_iterator(folder)) {
        EXPECT_EQ(fs::perms::owner_read | fs::perms::owner_write, entry.status().permissions());
    }
    EXPECT_EQ(2u, files());
}

TEST_F(OutputFileTest, IsWrittenToWhereNothingCanTakeItsPlace) {
    const auto make = [this](const std::string& bytes) {
        return OutputFileTest::make(path("file"), bytes).isGood();
    };
    const struct {
        const char* name;
        mode_t folder;
    } rows[] = {
            {"a folder that takes no file", 0555},
            {"a folder that gives up no file of another one", 01777},
            {"a folder in which a file would have another owner", 0777},
    };
    for (const auto& row : rows) {
        if (geteuid() != 0 && row.folder != 0555) {
            // There is nobody else whose file it could be.
            continue;
        }
        const std::string file = write("file", "old and longer");
        struct stat before {};
        ASSERT_EQ(0, stat(file.c_str(), &before));
        ASSERT_EQ(0, chmod(file.c_str(), 0666));
        ASSERT_EQ(0, chmod(folder.c_str(), row.folder));
        EXPECT_EQ(0, inChild([&] {
                      becomeNobody();
                      return make(std::string(200000, 'a')) &&
                             contents(file) == std::string(200000, 'a') && make("new");
                  }))
                << row.name;
        EXPECT_EQ("new", contents(file)) << row.name;
        EXPECT_EQ(0, inChild([&] {
                      becomeNobody();
                      return make("");
                  }))
                << row.name;
        EXPECT_EQ("", contents(file)) << row.name;
        struct stat after {};
        ASSERT_EQ(0, stat(file.c_str(), &after));
        EXPECT_EQ(before.st_ino, after.st_ino) << row.name;
        EXPECT_EQ(before.st_uid, after.st_uid) << row.name;
        EXPECT_EQ(1u, files()) << row.name;
        ASSERT_EQ(0, chmod(folder.c_str(), 0700));
        ASSERT_TRUE(fs::remove(file));
    }
    // Without a file that may be written to, there is nothing.
    ASSERT_EQ(0, chmod(folder.c_str(), 0555));
    EXPECT_EQ(1, inChild([&] {
                  becomeNobody();
                  return make("bytes");
              }));
    ASSERT_EQ(0, chmod(folder.c_str(), 0700));
    EXPECT_EQ(0u, files());
}

TEST_F(OutputFileTest, IsNotTouchedBeforeThereIsSomethingToWriteEvenWhereItMustBeWrittenTo) {
    const std::string file = write("file", "precious");
    ASSERT_EQ(0, chmod(file.c_str(), 0666));
    ASSERT_EQ(0, chmod(folder.c_str(), 0555));
    EXPECT_EQ(0, inChild([&] {
                  becomeNobody();
                  OutputFile output;
                  return output.open(file) && output.write("a few bytes");
              }));
    ASSERT_EQ(0, chmod(folder.c_str(), 0700));
    EXPECT_EQ("precious", contents(file));
}

TEST_F(OutputFileTest, IsWrittenToWhereItIsMounted) {
    const std::string file = write("file", "what is below");
    const std::string mounted = write("mounted", "old and longer");
    constexpr int kNoMount = 77;
    const int status = inChild([&] {
        if (unshare(CLONE_NEWNS) != 0 ||
            mount("none", "/", nullptr, MS_REC | MS_PRIVATE, nullptr) != 0 ||
            mount(mounted.c_str(), file.c_str(), nullptr, MS_BIND, nullptr) != 0) {
            _exit(kNoMount);
        }
        const std::string bytes(200000, 'a');
        return make(file, bytes).isGood() && contents(file) == bytes && make(file, "new").isGood();
    });
    if (status == kNoMount) {
        GTEST_SKIP() << "nothing can be mounted here";
    }
    EXPECT_EQ(0, status);
    EXPECT_EQ("new", contents(mounted));
    EXPECT_EQ("what is below", contents(file));
    EXPECT_EQ(2u, files());
}

TEST_F(OutputFileTest, IsNotMadeWhereTheDiskIsFull) {
    const std::string kept = write("file", "precious");
    {
        const test::FullDisk full(1000);
        OutputFile file;
        EXPECT_TRUE(file.open(kept));
        EXPECT_TRUE(file.write(std::string(2000, 'a')));
        EXPECT_FALSE(file.close());
        EXPECT_EQ("cannot write " + kept + ": File too large", file.problem());
        EXPECT_FALSE(file.write("more"));
    }
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
