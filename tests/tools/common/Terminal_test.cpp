// SPDX-License-Identifier: Apache-2.0
#include "tools/common/Terminal.h"

#include <gtest/gtest.h>

namespace pemaro::tools {

TEST(Terminal, CanBeDrawnOnByItsName) {
    const struct {
        const char* term;
        bool drawable;
    } rows[] = {{"", false}, {"dumb", false}, {"vt100", true}, {"xterm-256color", true}};
    for (const auto& row : rows) {
        EXPECT_EQ(row.drawable, canBeDrawnOn(row.term)) << row.term;
    }
}

TEST(Terminal, ShowsALineThatIsCut) {
    const struct {
        const char* text;
        int columns;
        const char* cut;
    } rows[] = {
            {"", 5, ""},
            {"five5", 5, "five5"},
            {"sixsix", 5, "sixsi"},
            {"sixsix", 0, ""},
            {"sixsix", -1, ""},
            {"n\u00E4her", 2, "n\u00E4"},
            {"n\u00E4her", 1, "n"},
            // Two columns, or perhaps one.
            {"a\u624B\u638C", 4, "a\u624B"},
            {"a\u624B\u638C", 5, "a\u624B\u638C"},
            {"\U0001F590b", 1, ""},
            // No UTF-8.
            {"\xFF", 3, "\xFF"},
            {"ab\x80\x80", 3, "ab\x80"},
    };
    for (const auto& row : rows) {
        EXPECT_EQ(row.cut, cutToColumns(row.text, row.columns)) << row.text;
    }
}

}  // namespace pemaro::tools
