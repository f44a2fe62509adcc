// SPDX-License-Identifier: Apache-2.0
#include "frames/Draft.h"

#include <android-base/file.h>
#include <gtest/gtest.h>
#include <unistd.h>

#include <cerrno>
#include <filesystem>
#include <string>

#include "tests/support/FolderTest.h"

namespace pemaro::frames {
namespace {

namespace fs = std::filesystem;

class DraftTest : public test::FolderTest {
  protected:
    struct stat make(mode_t mode) const {
        struct stat info {};
        EXPECT_EQ(0, chmod(write("file", "old").c_str(), mode));
        EXPECT_EQ(0, stat(file.c_str(), &info));
        return info;
    }

    const std::string file = path("file");
};

TEST_F(DraftTest, TakesThePlaceOfTheOldOne) {
    const struct stat old = make(0640);
    Draft draft;
    ASSERT_TRUE(draft.open(file, &old));
    EXPECT_TRUE(android::base::WriteStringToFd("new", draft.fd()));
    struct stat beside {};
    ASSERT_EQ(0, fstat(draft.fd(), &beside));
    EXPECT_EQ(0600u, beside.st_mode & 07777) << "nobody else reads what is not complete";
    EXPECT_EQ("old", contents(file));
    EXPECT_TRUE(draft.commit());
    EXPECT_TRUE(draft.close());
    EXPECT_EQ("new", contents(file));
    struct stat now {};
    ASSERT_EQ(0, stat(file.c_str(), &now));
    EXPECT_EQ(0640u, now.st_mode & 07777);
    EXPECT_EQ(old.st_uid, now.st_uid);
    EXPECT_EQ(1u, files());
}

TEST_F(DraftTest, TakesAPlaceThatIsFree) {
    Draft draft;
    ASSERT_TRUE(draft.open(file, nullptr));
    EXPECT_FALSE(fs::exists(file));
    EXPECT_TRUE(draft.commit());
    EXPECT_TRUE(draft.close());
    EXPECT_TRUE(fs::exists(file));
    EXPECT_EQ("", contents(file));
}

TEST_F(DraftTest, TakesThePlaceOfWhatALinkLeadsTo) {
    const struct stat old = make(0644);
    const std::string link = path("link");
    fs::create_symlink("file", link);
    Draft draft;
    ASSERT_TRUE(draft.open(link, &old));
    EXPECT_TRUE(android::base::WriteStringToFd("new", draft.fd()));
    EXPECT_TRUE(draft.commit());
    EXPECT_TRUE(fs::is_symlink(link));
    EXPECT_EQ("new", contents(file));
}

TEST_F(DraftTest, IsTakenBackAndLeavesTheOldOne) {
    const struct stat old = make(0644);
    {
        Draft draft;
        ASSERT_TRUE(draft.open(file, &old));
        Draft another;
        ASSERT_TRUE(another.open(file, &old)) << "two at once have two names";
        EXPECT_EQ(3u, files());
    }
    EXPECT_EQ(1u, files());
    EXPECT_EQ("old", contents(file));
}

TEST_F(DraftTest, NeedsAFolder) {
    Draft draft;
    EXPECT_FALSE(draft.open(path("none/file"), nullptr));
    EXPECT_EQ(ENOENT, errno);
}

}  // namespace
}  // namespace pemaro::frames
