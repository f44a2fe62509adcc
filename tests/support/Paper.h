// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <fcntl.h>
#include <gtest/gtest.h>
#include <poll.h>
#include <stdlib.h>
#include <sys/ioctl.h>
#include <unistd.h>

#include <string>

namespace pemaro::test {

/// A terminal that keeps what it is sent.
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

    /// All of what was sent since the last time, which takes a moment to arrive, is this.
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

    /// What was sent since the last time, until there is no more for a moment.
    std::string text() const {
        std::string seen;
        pollfd entry{mOther, POLLIN, 0};
        while (poll(&entry, 1, 200) > 0) {
            char bytes[4096];
            const ssize_t got = read(mOther, bytes, sizeof(bytes));
            seen.append(bytes, got < 0 ? 0 : static_cast<size_t>(got));
        }
        return seen;
    }

    int fd = -1;

  private:
    const int mOther = posix_openpt(O_RDWR | O_NOCTTY | O_NONBLOCK | O_CLOEXEC);
};

/// Gives TERM a value, and takes it back.
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

}  // namespace pemaro::test
