// SPDX-License-Identifier: Apache-2.0
#include "frames/FrameFile.h"

#include <android-base/errno_restorer.h>
#include <android-base/macros.h>
#include <fcntl.h>
#include <limits.h>
#include <poll.h>
#include <sys/file.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <chrono>
#include <cstdint>
#include <cstring>
#include <thread>
#include <utility>

#include "frames/OwnDescriptor.h"

namespace pemaro::frames {
namespace {

/// How often the other end of a pipe is looked at.
constexpr std::chrono::milliseconds kPeriod(20);

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
    // Nothing was to be written to it after all.
    if (mFd.ok() && mIsCreated && !mHasBegun) {
        ::unlink(mPath.c_str());
    }
}

bool FrameFile::open(const std::string& path, std::function<bool()> giveUp) {
    mPath = mName = path;
    mGiveUp = std::move(giveUp);
    struct stat info {};
    const int descriptor = path == "-" ? STDOUT_FILENO : ownDescriptor(path);
    if (descriptor >= 0) {
        mName = path == "-" ? "the standard output" : path;
        mIsCallers = true;
        mFd.reset(::fcntl(descriptor, F_DUPFD_CLOEXEC, 0));
    } else if (::stat(path.c_str(), &info) == 0) {
        if (S_ISFIFO(info.st_mode)) {
            return openFifo(path);
        }
        mFd.reset(::open(path.c_str(), O_WRONLY | O_CLOEXEC));
    } else {
        mFd.reset(::open(path.c_str(), O_WRONLY | O_CREAT | O_CLOEXEC, 0644));
        mIsCreated = mFd.ok();
    }
    mIsFile = mFd.ok() && ::fstat(mFd.get(), &info) == 0 && S_ISREG(info.st_mode);
    if (!mFd.ok()) {
        return fail("open");
    }
    return !mIsFile || mIsCallers || lock();
}

/// Two at once would write over each other's frames.
bool FrameFile::lock() {
    // Where a file system knows no locks, nobody is kept away.
    if (TEMP_FAILURE_RETRY(::flock(mFd.get(), LOCK_EX | LOCK_NB)) != 0 && errno == EWOULDBLOCK) {
        mFd.reset();
        mProblem = "cannot open " + mName + ": somebody else is writing to it";
        return false;
    }
    struct stat locked {};
    struct stat there {};
    // Whoever had created it, and then had nothing to write to it, has taken it away meanwhile.
    const bool isThere = ::fstat(mFd.get(), &locked) == 0 && ::stat(mPath.c_str(), &there) == 0 &&
                         locked.st_dev == there.st_dev && locked.st_ino == there.st_ino;
    if (!isThere) {
        mIsCreated = false;
        return open(mPath, std::move(mGiveUp));
    }
    // Somebody else may have written to it before it was locked.
    mIsCreated = mIsCreated && locked.st_size == 0;
    return true;
}

bool FrameFile::openFifo(const std::string& path) {
    // Opened to wait, it could not be given up.
    mFd.reset(::open(path.c_str(), O_WRONLY | O_NONBLOCK | O_CLOEXEC));
    while (!mFd.ok() && errno == ENXIO && !givesUp()) {
        std::this_thread::sleep_for(kPeriod);
        mFd.reset(::open(path.c_str(), O_WRONLY | O_NONBLOCK | O_CLOEXEC));
    }
    return mFd.ok() || fail("open");
}

bool FrameFile::write(const void* frame, size_t length) {
    if (!mProblem.empty() || !begin()) {
        return false;
    }
    mWithinFrame = true;
    const Appended appended =
            mIsFile ? appendFrame(mFd.get(), frame, length) : appendToStream(frame, length);
    mWithinFrame = appended == Appended::kPart;
    if (appended == Appended::kWhole) {
        return true;
    }
    fail("write");
    if (appended == Appended::kPart) {
        mProblem += ", which ends within a frame";
    }
    return false;
}

/// What a file held before gives way. A descriptor is the caller's, who may be adding to its file.
bool FrameFile::begin() {
    if (!mHasBegun && mIsFile && !mIsCallers && ::ftruncate(mFd.get(), 0) != 0) {
        return fail("write");
    }
    mHasBegun = true;
    return true;
}

Appended FrameFile::appendToStream(const void* frame, size_t length) {
    const auto* next = static_cast<const uint8_t*>(frame);
    size_t left = length;
    while (left > 0) {
        // A pipe that has room has room for so much.
        const ssize_t written =
                awaitRoom() ? ::write(mFd.get(), next, std::min<size_t>(left, PIPE_BUF)) : -1;
        if (written >= 0) {
            next += written;
            left -= static_cast<size_t>(written);
        } else if (errno != EINTR && errno != EAGAIN) {
            return left == length ? Appended::kNothing : Appended::kPart;
        }
    }
    return Appended::kWhole;
}

/// False, with an errno, when it is given up.
bool FrameFile::awaitRoom() const {
    pollfd entry{mFd.get(), POLLOUT, 0};
    while (::poll(&entry, 1, static_cast<int>(kPeriod.count())) == 0) {
        if (givesUp()) {
            errno = ETIMEDOUT;
            return false;
        }
    }
    return true;
}

bool FrameFile::close() {
    if (mFd.ok() && mProblem.empty()) {
        begin();
    }
    if (mFd.ok() && ::close(mFd.release()) != 0 && mProblem.empty()) {
        fail("write");
    }
    return mProblem.empty();
}

bool FrameFile::fail(const char* what) {
    mProblem = std::string("cannot ") + what + " " + mName + ": " + strerror(errno);
    return false;
}

}  // namespace pemaro::frames
