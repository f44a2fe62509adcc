// SPDX-License-Identifier: Apache-2.0
#include "frames/FrameFile.h"

#include <fcntl.h>
#include <unistd.h>

#include <cerrno>
#include <cstdint>
#include <cstring>

namespace pemaro::frames {

FrameFile::~FrameFile() {
    close();
}

bool FrameFile::open(const std::string& path) {
    mPath = path;
    mFd = ::open(path.c_str(), O_WRONLY | O_CREAT | O_TRUNC | O_CLOEXEC, 0644);
    return mFd >= 0 || fail("open");
}

bool FrameFile::write(const void* frame, size_t length) {
    if (!mProblem.empty()) {
        return false;
    }
    const auto* next = static_cast<const uint8_t*>(frame);
    size_t left = length;
    while (left > 0) {
        const ssize_t written = ::write(mFd, next, left);
        if (written < 0 && errno == EINTR) {
            continue;
        }
        if (written < 0) {
            fail("write");
            // What was written of this frame is taken back; a pipe has nothing to take back.
            if (left < length && ::ftruncate(mFd, mEnd) != 0) {
                mProblem += ", which ends within a frame";
            }
            return false;
        }
        next += written;
        left -= static_cast<size_t>(written);
    }
    mEnd += static_cast<off_t>(length);
    return true;
}

bool FrameFile::close() {
    if (mFd < 0) {
        return mProblem.empty();
    }
    const int status = ::close(mFd);
    mFd = -1;
    if (status != 0 && mProblem.empty()) {
        fail("write");
    }
    return mProblem.empty();
}

bool FrameFile::fail(const char* what) {
    mProblem = std::string("cannot ") + what + " " + mPath + ": " + strerror(errno);
    return false;
}

}  // namespace pemaro::frames
