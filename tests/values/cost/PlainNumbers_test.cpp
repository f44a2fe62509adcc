// SPDX-License-Identifier: Apache-2.0

// Which numbers the C library is asked for: those that are not plain. It takes several times as long.

#include <gtest/gtest.h>

#include <cfloat>
#include <cstdarg>
#include <cstdio>
#include <limits>
#include <ostream>
#include <string>

#include "values/NumberText.h"

namespace {

int gCalls = 0;

}  // namespace

// The linker puts these in the place of the C library's, which has sscanf under a name for each standard.
extern "C" {

int __wrap_sscanf(const char* text, const char* format, ...) {
    ++gCalls;
    va_list arguments;
    va_start(arguments, format);
    const int found = vsscanf(text, format, arguments);
    va_end(arguments);
    return found;
}

int __wrap___isoc99_sscanf(const char* text, const char* format, ...)
        __attribute__((alias("__wrap_sscanf")));

int __wrap_snprintf(char* text, size_t size, const char* format, ...) {
    ++gCalls;
    va_list arguments;
    va_start(arguments, format);
    const int length = vsnprintf(text, size, format, arguments);
    va_end(arguments);
    return length;
}
}

namespace pemaro {
namespace {

struct Text {
    const char* text;
    int calls;  ///< of the C library
    const char* why;
};

void PrintTo(const Text& row, std::ostream* out) {
    *out << '\'' << row.text << "', " << row.why;
}

class PlainInteger : public ::testing::TestWithParam<Text> {};
class PlainFloat : public ::testing::TestWithParam<Text> {};

INSTANTIATE_TEST_SUITE_P(Texts, PlainInteger,
                         ::testing::Values(Text{"0", 0, "a digit"}, Text{"-17", 0, "a sign"},
                                           Text{" +17x", 0, "what is around it"},
                                           Text{"123456789012345678", 0,
                                                "as many digits as surely fit"},
                                           Text{"1234567890123456789", 1, "a digit more"},
                                           Text{"", 0, "no number"}, Text{"-", 0, "no digit"}));

TEST_P(PlainInteger, IsReadWithoutTheCLibrary) {
    uint32_t number = 0;
    gCalls = 0;
    scanUnsigned(GetParam().text, number);
    EXPECT_EQ(GetParam().calls, gCalls);
    int32_t negative = 0;
    gCalls = 0;
    scanSigned(GetParam().text, negative);
    EXPECT_EQ(GetParam().calls, gCalls);
}

INSTANTIATE_TEST_SUITE_P(
        Texts, PlainFloat,
        ::testing::Values(Text{"0", 0, "a digit"}, Text{"-17.25", 0, "a sign and a point"},
                          Text{" +.5,", 0, "what is around it"}, Text{"1.5.", 0, "a second point"},
                          Text{"9007199254740991", 0, "as much as a double has digits for"},
                          Text{"9007199254740992", 1, "one more"},
                          Text{".000000000000000001", 0,
                               "as many digits as there are powers of ten"},
                          Text{"0.000000000000000001", 1, "a digit more"},
                          Text{"16777216", 0, "as much as a float has digits for"},
                          Text{"16777217", 1, "halfway between two floats"},
                          Text{"1e5", 1, "an exponent"}, Text{"0x10", 1, "another base"},
                          Text{"inf", 1, "no digit"}, Text{"", 1, "no number"}));

TEST_P(PlainFloat, IsReadWithoutTheCLibrary) {
    float number = 0;
    gCalls = 0;
    scanFloat(GetParam().text, number);
    EXPECT_EQ(GetParam().calls, gCalls);
}

TEST(PlainNumber, IsWrittenWithoutTheCLibrary) {
    gCalls = 0;
    for (const float number : {0.0f, -17.25f, FLT_MAX, FLT_MIN, FLT_TRUE_MIN}) {
        formatFloat(number);
    }
    formatSigned(-17);
    formatUnsigned(17);
    EXPECT_EQ(0, gCalls);
    EXPECT_EQ("inf", formatFloat(std::numeric_limits<float>::infinity()));
    EXPECT_EQ(1, gCalls);
}

}  // namespace
}  // namespace pemaro
