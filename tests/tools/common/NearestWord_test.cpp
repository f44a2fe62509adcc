// SPDX-License-Identifier: Apache-2.0
#include "tools/common/NearestWord.h"

#include <gtest/gtest.h>

namespace pemaro::tools {

TEST(NearestWord, IsTheOneThatWasProbablyMeant) {
    const std::vector<std::string> words = {"ping", "record", "record-file", "touch", "config"};
    const struct {
        const char* typed;
        const char* nearest;
    } rows[] = {
            {"pign", "ping"},       // two letters exchanged
            {"recrd", "record"},    // one left out
            {"reccord", "record"},  // one added
            {"rekord", "record"},   // one replaced
            {"recrod-fiel", "record-file"},
            {"conifg", "config"},
            {"ping", "ping"},
            {"fly", ""},
            {"ring-buffer", ""},
            {"", ""},
    };
    for (const auto& row : rows) {
        EXPECT_EQ(row.nearest, nearestWord(row.typed, words)) << row.typed;
    }
    EXPECT_EQ("", nearestWord("ping", {}));
    EXPECT_EQ("; did you mean 'ping'?", nearestWordHint("pign", words));
    EXPECT_EQ("", nearestWordHint("fly", words));
}

}  // namespace pemaro::tools
