// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/terminal/Number.h"

#include <gtest/gtest.h>

#include <optional>

#include "pemaro/Status.h"

namespace pemaro::zelkctl {

TEST(Number, IsReadAsCWritesIt) {
    const struct {
        const char* text;
        NumberRange range;
        std::optional<int64_t> number;
    } rows[] = {
            {"0", kUnsigned32, 0},
            {"31", kUnsigned32, 31},
            {"0x1f", kUnsigned32, 31},
            {"0X1F", kUnsigned32, 31},
            {"010", kUnsigned32, 8},
            {"-3", kSigned32, -3},
            {"-0x10", kSigned32, -16},
            {"4294967295", kUnsigned32, 4294967295},
            {"0xffffffff", kAny32, 4294967295},
            {"-2147483648", kAny32, -2147483648},
            {"4294967296", kUnsigned32, std::nullopt},
            {"-1", kUnsigned32, std::nullopt},
            {"2147483648", kSigned32, std::nullopt},
            {"-2147483649", kAny32, std::nullopt},
            {"99999999999999999999", kAny32, std::nullopt},
            {"", kAny32, std::nullopt},
            {"-", kAny32, std::nullopt},
            {"--1", kAny32, std::nullopt},
            {"+1", kAny32, std::nullopt},
            {" 1", kAny32, std::nullopt},
            {"1 ", kAny32, std::nullopt},
            {"0x", kAny32, std::nullopt},
            {"0x1g", kAny32, std::nullopt},
            {"08", kAny32, std::nullopt},
            {"7x", kAny32, std::nullopt},
            {"1.5", kAny32, std::nullopt},
            {"many", kAny32, std::nullopt},
    };
    for (const auto& row : rows) {
        EXPECT_EQ(row.number, parseNumber(row.text, row.range)) << "'" << row.text << "'";
    }
}

TEST(Number, ThatIsNoneIsNamed) {
    testing::internal::CaptureStderr();
    EXPECT_FALSE(readNumber("filter", "MASK", "0x1g", kUnsigned32));
    EXPECT_EQ(
            "zelkctl: filter: Error parsing parameter (MASK: '0x1g' is no number from 0 to "
            "4294967295)\n",
            testing::internal::GetCapturedStderr());
}

TEST(Number, ListsHaveSingleSpaces) {
    const struct {
        const char* list;
        const char* refused;  // the word that is no number, if any
    } rows[] = {
            {"1", nullptr}, {"3 0x10 -5", nullptr}, {"", ""},       {" 1", ""},
            {"1 ", ""},     {"1  2", ""},           {"1 x 2", "x"},
    };
    for (const auto& row : rows) {
        testing::internal::CaptureStderr();
        EXPECT_EQ(row.refused == nullptr, checkNumbers("command", row.list)) << row.list;
        EXPECT_EQ(row.refused == nullptr
                          ? ""
                          : "zelkctl: command: Error parsing parameter (number: '" +
                                    std::string(row.refused) +
                                    "' is no number from -2147483648 to 4294967295)\n",
                  testing::internal::GetCapturedStderr());
    }
}

}  // namespace pemaro::zelkctl
