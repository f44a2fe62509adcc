// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/files/OutputFile.h"

#include <android-base/file.h>
#include <fcntl.h>
#include <unistd.h>

#include <cerrno>
#include <cstring>

namespace pemaro::zelkctl {
namespace {

constexpr size_t kHoldBack = 1 << 16;

}  // namespace

bool OutputFile::open(const std::string& path) {
    if (path == "-") {
        mPath = "the standard output";
        mFd.reset(fcntl(STDOUT_FILENO, F_DUPFD_CLOEXEC, 0));
    } else {
        mPath = path;
        mFd.reset(::open(path.c_str(), O_WRONLY | O_CREAT | O_TRUNC | O_CLOEXEC, 0644));
    }
    return mFd.ok() || fail("open");
}

bool OutputFile::write(const std::string& text) {
    mHeld += text;
    return mHeld.size() < kHoldBack ? mProblem.empty() : flush();
}

bool OutputFile::flush() {
    if (mProblem.empty() && !android::base::WriteFully(mFd, mHeld.data(), mHeld.size())) {
        fail("write");
    }
    mHeld.clear();
    return mProblem.empty();
}

bool OutputFile::close() {
    if (flush() && ::close(mFd.release()) != 0) {
        fail("write");
    }
    return mProblem.empty();
}

bool OutputFile::fail(const char* what) {
    mProblem = std::string("cannot ") + what + " " + mPath + ": " + strerror(errno);
    return false;
}

}  // namespace pemaro::zelkctl
