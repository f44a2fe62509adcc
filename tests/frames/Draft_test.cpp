// SPDX-License-Identifier: Apache-2.0
#include "frames/Draft.h"

#include <android-base/file.h>
#include <gtest/gtest.h>
#include <unistd.h>

#include <cerrno>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <string>

namespace pemaro::frames {
namespace {

namespace fs = std::filesystem;

class DraftTest : public ::testing::Test {
  protected:
    DraftTest() { fs::create_directory(folder); }
    ~DraftTest() override { fs::remove_all(folder); }

    struct stat make(mode_t mode) const {
        std::ofstream(path) << "old";
        struct stat info {};
        EXPECT_EQ(0, chmod(path.c_str(), mode));
        EXPECT_EQ(0, stat(path.c_str(), &info));
        return info;
    }

    std::string contents() const {
        std::string text;
        EXPECT_TRUE(android::base::ReadFileToString(path, &text, true));
        return text;
    }

    auto files() const { return std::distance(fs::directory_iterator(folder), {}); }

    const std::string folder = testing::TempDir() + "Draft_test." + std::to_string(getpid());
    const std::string path = folder + "/file";
};

TEST_F(DraftTest, TakesThePlaceOfTheOldOne) {
    const struct stat old = make(0640);
    Draft draft;
    ASSERT_TRUE(draft.open(path, &old));
    EXPECT_TRUE(android::base::WriteStringToFd("new", draft.fd()));
    struct stat beside {};
    ASSERT_EQ(0, fstat(draft.fd(), &beside));
    EXPECT_EQ(0600u, beside.st_mode & 07777) << "nobody else reads what is not complete";
    EXPECT_EQ("old", contents());
    EXPECT_TRUE(draft.commit());
    EXPECT_TRUE(draft.close());
    EXPECT_EQ("new", contents());
    struct stat now {};
    ASSERT_EQ(0, stat(path.c_str(), &now));
    EXPECT_EQ(0640u, now.st_mode & 07777);
    EXPECT_EQ(old.st_uid, now.st_uid);
    EXPECT_EQ(1, files());
}

TEST_F(DraftTest, TakesAPlaceThatIsFree) {
    Draft draft;
    ASSERT_TRUE(draft.open(path, nullptr));
    EXPECT_FALSE(fs::exists(path));
    EXPECT_TRUE(draft.commit());
    EXPECT_TRUE(draft.close());
    EXPECT_EQ("", contents());
}

TEST_F(DraftTest, TakesThePlaceOfWhatALinkLeadsTo) {
    const struct stat old = make(0644);
    const std::string link = folder + "/link";
    fs::create_symlink("file", link);
    Draft draft;
    ASSERT_TRUE(draft.open(link, &old));
    EXPECT_TRUE(android::base::WriteStringToFd("new", draft.fd()));
    EXPECT_TRUE(draft.commit());
    EXPECT_TRUE(fs::is_symlink(link));
    EXPECT_EQ("new", contents());
}

TEST_F(DraftTest, IsTakenBackAndLeavesTheOldOne) {
    const struct stat old = make(0644);
    {
        Draft draft;
        ASSERT_TRUE(draft.open(path, &old));
        Draft another;
        ASSERT_TRUE(another.open(path, &old)) << "two at once have two names";
        EXPECT_EQ(3, files());
    }
    EXPECT_EQ(1, files());
    EXPECT_EQ("old", contents());
}

TEST_F(DraftTest, NeedsAFolder) {
    Draft draft;
    EXPECT_FALSE(draft.open(folder + "/none/file", nullptr));
    EXPECT_EQ(ENOENT, errno);
}

}  // namespace
}  // namespace pemaro::frames
