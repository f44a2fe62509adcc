// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/trace/ProcessNames.h"

#include <android-base/file.h>
#include <gtest/gtest.h>

#include <filesystem>
#include <string>

#include "tests/tools/zelkctl/trace/SomeCall.h"

namespace pemaro::zelkctl {

namespace {

class ProcessNamesTest : public ::testing::Test {
  protected:
    void write(const std::string& name, const std::string& content) {
        const std::filesystem::path path = mFolder.path + ("/" + name);
        std::filesystem::create_directories(path.parent_path());
        ASSERT_TRUE(android::base::WriteStringToFile(content, path));
    }

    TemporaryDir mFolder;
    ProcessNames mNames{[](int thread) { return thread == 147 ? "remembered" : ""; }, mFolder.path};
};

}  // namespace

TEST_F(ProcessNamesTest, AreThoseOfTheProgramsThatRun) {
    write("146/cmdline", std::string("/usr/bin/zelkctl\0ping\0", 22));
    write("137/cmdline", "com.example.app");
    EXPECT_EQ("zelkctl", mNames.caller(someCall()).name);
    EXPECT_EQ(146, mNames.caller(someCall()).process);
    EXPECT_EQ(147, mNames.caller(someCall()).thread);
    EXPECT_EQ("com.example.app", mNames.callee(someCall()).name);
    EXPECT_EQ(143, mNames.callee(someCall()).thread);
}

TEST_F(ProcessNamesTest, AreKeptWhenTheProgramHasEnded) {
    write("137/cmdline", "stack");
    EXPECT_EQ("stack", mNames.callee(someCall()).name);
    write("137/cmdline", "");
    EXPECT_EQ("stack", mNames.callee(someCall()).name);
    write("137/cmdline", "another");
    EXPECT_EQ("another", mNames.callee(someCall()).name);
}

TEST_F(ProcessNamesTest, AreTheKernelsWhereItEndedBefore) {
    EXPECT_EQ("remembered", mNames.caller(someCall()).name);
    EXPECT_EQ("?", mNames.callee(someCall()).name);
}

TEST_F(ProcessNamesTest, FindTheProcessOfAThread) {
    write("147/status", "Name:\tworker\nUmask:\t0022\nTgid:\t146\nPid:\t147\n");
    write("146/cmdline", "zelkctl");
    EXPECT_EQ(146, mNames.caller(openCall()).process);
    EXPECT_EQ("zelkctl", mNames.caller(openCall()).name);
    std::filesystem::remove_all(mFolder.path + std::string("/147"));
    EXPECT_EQ(0, mNames.caller(openCall()).process);
    EXPECT_EQ("remembered", mNames.caller(openCall()).name);
}

TEST_F(ProcessNamesTest, CanBePrinted) {
    write("146/cmdline", "an\x1b[31mapp");
    EXPECT_EQ("an?[31mapp", mNames.caller(someCall()).name);
}

}  // namespace pemaro::zelkctl
