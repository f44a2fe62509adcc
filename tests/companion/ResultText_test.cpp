// SPDX-License-Identifier: Apache-2.0
#include "companion/ResultText.h"

#include <gtest/gtest.h>

#include <cstdlib>
#include <cstring>
#include <string>

#include "pemaro/Status.h"

namespace pemaro::test {
namespace {

size_t gAskedFor = 0;

void* noMemory(size_t size) {
    gAskedFor = size;
    return nullptr;
}

void* countingMalloc(size_t size) {
    gAskedFor = size;
    return malloc(size);
}

TEST(ResultText, IsACopyThatTheCallerFrees) {
    std::string source = "done";
    char* result = nullptr;
    EXPECT_EQ(0, copyResultText(source, &result, countingMalloc));
    source.assign("gone");
    EXPECT_STREQ("done", result);
    EXPECT_EQ(5u, gAskedFor);
    free(result);
}

TEST(ResultText, EmptyTextIsItsNulAlone) {
    char* result = nullptr;
    EXPECT_EQ(0, copyResultText("", &result, countingMalloc));
    EXPECT_STREQ("", result);
    EXPECT_EQ(1u, gAskedFor);
    free(result);
}

TEST(ResultText, LongTextIsNotCut) {
    const std::string source(100000, 'x');
    char* result = nullptr;
    EXPECT_EQ(0, copyResultText(source, &result, malloc));
    EXPECT_EQ(source, result);
    free(result);
}

TEST(ResultText, IsNullWhenThereIsNoMemory) {
    char before[] = "before";
    char* result = before;
    EXPECT_EQ(0x40000006, copyResultText("done", &result, noMemory));
    EXPECT_EQ(nullptr, result);
    EXPECT_EQ(5u, gAskedFor);
}

}  // namespace
}  // namespace pemaro::test
