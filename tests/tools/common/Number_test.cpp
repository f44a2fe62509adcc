// SPDX-License-Identifier: Apache-2.0
#include "tools/common/Number.h"

#include <gtest/gtest.h>

#include <optional>

namespace pemaro::tools {

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
    EXPECT_EQ("", numberProblem("7", kUnsigned32));
    EXPECT_EQ("'0x1g' is no number from 0 to 4294967295", numberProblem("0x1g", kUnsigned32));
    EXPECT_EQ("", decimalProblem("0.5", {0, 1}));
    EXPECT_EQ("'nan' is no number from 0.001 to 1000000", decimalProblem("nan", {0.001, 1e6}));
}

TEST(Number, WithAFractionIsOneThatIsThere) {
    const struct {
        const char* text;
        std::optional<double> number;
    } rows[] = {
            {"0", 0.0},
            {"0.25", 0.25},
            {"1e2", 100.0},
            {"-1.5", -1.5},
            {"100", 100.0},
            {"100.1", std::nullopt},
            {"-2.1", std::nullopt},
            {"nan", std::nullopt},
            {"-nan", std::nullopt},
            {"inf", std::nullopt},
            {"-inf", std::nullopt},
            {"infinity", std::nullopt},
            {"1e999", std::nullopt},
            {"", std::nullopt},
            {"-", std::nullopt},
            {" 1", std::nullopt},
            {"+1", std::nullopt},
            {"1 ", std::nullopt},
            {"0x10", std::nullopt},
            {"1.5s", std::nullopt},
    };
    for (const auto& row : rows) {
        EXPECT_EQ(row.number, parseDecimal(row.text, {-2, 100})) << "'" << row.text << "'";
    }
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
        EXPECT_EQ(row.refused == nullptr ? ""
                                         : "'" + std::string(row.refused) +
                                                   "' is no number from -2147483648 to 4294967295",
                  numberListProblem(row.list))
                << row.list;
    }
}

}  // namespace pemaro::tools
