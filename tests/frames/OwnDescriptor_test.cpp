// SPDX-License-Identifier: Apache-2.0
#include "frames/OwnDescriptor.h"

#include <gtest/gtest.h>
#include <stdlib.h>
#include <unistd.h>

#include <filesystem>
#include <string>

namespace pemaro::frames {

TEST(OwnDescriptor, IsFoundThroughLinks) {
    std::string folder = testing::TempDir() + "OwnDescriptor_test.XXXXXX";
    ASSERT_NE(nullptr, mkdtemp(&folder[0]));
    ASSERT_EQ(0, symlink("/proc/self/fd/7", (folder + "/link").c_str()));
    ASSERT_EQ(0, symlink("link", (folder + "/further").c_str()));
    ASSERT_EQ(0, symlink("/proc/self/fd", (folder + "/fds").c_str()));
    ASSERT_EQ(0, symlink("loop", (folder + "/loop").c_str()));
    ASSERT_EQ(0, symlink("/dev/null", (folder + "/null").c_str()));
    const std::string pid = std::to_string(getpid());
    const struct {
        std::string path;
        int descriptor;
    } rows[] = {
            {"/proc/self/fd/1", 1},
            {"/proc/self/fd/123456", 123456},
            {"/proc/thread-self/fd/7", 7},
            {"/proc/" + pid + "/fd/7", 7},
            {"/proc/self/../self/fd//7", 7},
            {folder + "/link", 7},
            {folder + "/further", 7},
            {folder + "/fds/3", 3},
            {folder + "/loop", -1},
            {folder + "/null", -1},
            {folder + "/none", -1},
            {folder + "/none/1", -1},
            {folder, -1},
            {"/proc/self/fd", -1},
            {"/proc/self/fd/", -1},
            {"/proc/self/fd/x", -1},
            {"/proc/self/fd/-1", -1},
            {"/proc/self/fd/0x1", -1},
            {"/proc/self/status", -1},
            {"/proc/1/fd/1", -1},
            {"1", -1},
            {"-", -1},
            {"", -1},
    };
    for (const auto& row : rows) {
        EXPECT_EQ(row.descriptor, ownDescriptor(row.path)) << row.path;
    }
    // These are links that a machine may do without.
    if (access("/dev/fd", F_OK) == 0 && access("/dev/stdout", F_OK) == 0) {
        EXPECT_EQ(7, ownDescriptor("/dev/fd/7"));
        EXPECT_EQ(STDOUT_FILENO, ownDescriptor("/dev/stdout"));
        EXPECT_EQ(STDERR_FILENO, ownDescriptor("/dev/stderr"));
    }
    std::filesystem::remove_all(folder);
}

}  // namespace pemaro::frames
