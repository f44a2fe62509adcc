// SPDX-License-Identifier: Apache-2.0
#include "frames/FrameFile.h"

#include <android-base/errno_restorer.h>
#include <android-base/macros.h>
#include <fcntl.h>
#include <unistd.h>

#include <cerrno>
#include <cstdint>
#include <cstring>

namespace pemaro::frames {
namespace {

bool takeBack(int fd, size_t bytes) {
    const off_t end = ::lseek(fd, -static_cast<off_t>(bytes), SEEK_CUR);
    return end >= 0 && ::ftruncate(fd, end) == 0;
}

}  // namespace

Appended appendFrame(int fd, const void* frame, size_t length) {
    const auto* next = static_cast<const uint8_t*>(frame);
    size_t left = length;
    while (left > 0) {
        const ssize_t written = TEMP_FAILURE_RETRY(::write(fd, next, left));
        if (written < 0) {
            const android::base::ErrnoRestorer reason;
            return left == length || takeBack(fd, length - left) ? Appended::kNothing
                                                                 : Appended::kPart;
        }
        next += written;
        left -= static_cast<size_t>(written);
    }
    return Appended::kWhole;
}

FrameFile::~FrameFile() {
    close();
}

bool FrameFile::open(const std::string& path) {
    mPath = path;
    mFd.reset(::open(path.c_str(), O_WRONLY | O_CREAT | O_TRUNC | O_CLOEXEC, 0644));
    return mFd.ok() || fail("open");
}

bool FrameFile::write(const void* frame, size_t length) {
    if (!mProblem.empty()) {
        return false;
    }
    const Appended appended = appendFrame(mFd.get(), frame, length);
    if (appended == Appended::kWhole) {
        return true;
    }
    fail("write");
    if (appended == Appended::kPart) {
        mProblem += ", which ends within a frame";
    }
    return false;
}

bool FrameFile::close() {
    if (mFd.ok() && ::close(mFd.release()) != 0 && mProblem.empty()) {
        fail("write");
    }
    return mProblem.empty();
}

bool FrameFile::fail(const char* what) {
    mProblem = std::string("cannot ") + what + " " + mPath + ": " + strerror(errno);
    return false;
}

}  // namespace pemaro::frames
