// SPDX-License-Identifier: Apache-2.0
#include "tools/common/LiveLine.h"

#include <gtest/gtest.h>

#include <string>

#include "tests/support/Paper.h"

namespace pemaro::tools {

using test::Paper;
using test::Term;

TEST(LiveLine, IsCutAtTheWidthOfTheTerminal) {
    const Term term("vt100");
    const Paper paper(10);
    LiveLine line(paper.fd);
    EXPECT_TRUE(line.isTerminal());
    line.show("123456789");
    paper.expect("\r123456789\x1b[K");
    line.show("1234567890");
    paper.expect("\r123456789\x1b[K");
    paper.resize(5);
    line.show("1234567890");
    paper.expect("\r1234\x1b[K");
    // A terminal that does not know.
    paper.resize(0);
    line.show(std::string(200, 'a'));
    paper.expect("\r" + std::string(79, 'a') + "\x1b[K");
    line.clear();
    paper.expect("\r\x1b[K");
    line.end();
    line.show("1");
    paper.expect("\r1\x1b[K");
}

TEST(LiveLine, IsALineEachTimeOnATerminalThatCannotBeDrawnOn) {
    for (const char* const value : {"dumb", "", static_cast<const char*>(nullptr)}) {
        const Term term(value);
        const Paper paper(10);
        LiveLine line(paper.fd);
        EXPECT_FALSE(line.isTerminal());
        line.show("1234567890 and more");
        paper.expect("1234567890 and more\r\n");
        line.clear();
        line.end();
        line.show("1");
        paper.expect("1\r\n");
    }
}

}  // namespace pemaro::tools
