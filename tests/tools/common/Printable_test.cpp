// SPDX-License-Identifier: Apache-2.0
#include "tools/common/Printable.h"

#include <gtest/gtest.h>

namespace pemaro::tools {

TEST(Printable, PutsAQuestionMarkInPlaceOfEachControlCharacter) {
    EXPECT_EQ("a?b??", printable("a\nb\x1b\x7F"));
}

TEST(Printable, LeavesEverythingElseAsItIs) {
    EXPECT_EQ(" Zo\xC3\xAB ~", printable(" Zo\xC3\xAB ~"));
    EXPECT_EQ("", printable(""));
}

}  // namespace pemaro::tools
