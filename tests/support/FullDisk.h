// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <gtest/gtest.h>
#include <sys/resource.h>

#include <csignal>

namespace pemaro::test {

/// While it lives no file can grow beyond so many bytes: a limit on the size of files, as a full disk is one.
class FullDisk {
  public:
    explicit FullDisk(rlim_t bytes) : mHandler(signal(SIGXFSZ, SIG_IGN)) {
        EXPECT_EQ(0, getrlimit(RLIMIT_FSIZE, &mBefore));
        rlimit limit = mBefore;
        limit.rlim_cur = bytes;
        EXPECT_EQ(0, setrlimit(RLIMIT_FSIZE, &limit));
    }
    ~FullDisk() {
        EXPECT_EQ(0, setrlimit(RLIMIT_FSIZE, &mBefore));
        signal(SIGXFSZ, mHandler);
    }
    FullDisk(const FullDisk&) = delete;
    FullDisk& operator=(const FullDisk&) = delete;

  private:
    void (*const mHandler)(int);
    rlimit mBefore{};
};

}  // namespace pemaro::test
