// SPDX-License-Identifier: Apache-2.0
#include "tools/common/LiveLine.h"

#include <fcntl.h>
#include <gtest/gtest.h>
#include <poll.h>
#include <stdlib.h>
#include <sys/ioctl.h>
#include <unistd.h>

#include <string>

namespace pemaro::tools {

namespace {

// A terminal that keeps what it is sent.
class Paper {
  public:
    explicit Paper(unsigned short columns) {
        EXPECT_EQ(0, grantpt(mOther));
        EXPECT_EQ(0, unlockpt(mOther));
        char name[64];
        EXPECT_EQ(0, ptsname_r(mOther, name, sizeof(name)));
        fd = open(name, O_RDWR | O_NOCTTY | O_CLOEXEC);
        resize(columns);
    }
    ~Paper() {
        close(fd);
        close(mOther);
    }
    Paper(const Paper&) = delete;
    Paper& operator=(const Paper&) = delete;

    void resize(unsigned short columns) const {
        winsize size{};
        size.ws_row = columns == 0 ? 0 : 10;
        size.ws_col = columns;
        EXPECT_EQ(0, ioctl(fd, TIOCSWINSZ, &size));
    }

    // What was sent since the last time, which takes a moment to arrive.
    void expect(const std::string& text) const {
        std::string seen;
        pollfd entry{mOther, POLLIN, 0};
        while (seen.size() < text.size() && poll(&entry, 1, 5000) > 0) {
            char bytes[4096];
            const ssize_t got = read(mOther, bytes, sizeof(bytes));
            seen.append(bytes, got < 0 ? 0 : static_cast<size_t>(got));
        }
        EXPECT_EQ(text, seen);
    }

    int fd = -1;

  private:
    const int mOther = posix_openpt(O_RDWR | O_NOCTTY | O_NONBLOCK | O_CLOEXEC);
};

// Gives TERM a value, and takes it back.
class Term {
  public:
    explicit Term(const char* value) {
        const char* before = getenv("TERM");
        mWasSet = before != nullptr;
        mBefore = mWasSet ? before : "";
        value == nullptr ? unsetenv("TERM") : setenv("TERM", value, 1);
    }
    ~Term() { mWasSet ? setenv("TERM", mBefore.c_str(), 1) : unsetenv("TERM"); }

  private:
    bool mWasSet;
    std::string mBefore;
};

}  // namespace

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
