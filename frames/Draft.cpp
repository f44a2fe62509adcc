// SPDX-License-Identifier: Apache-2.0
#include "frames/Draft.h"

#include <android-base/file.h>
#include <fcntl.h>
#include <stdio.h>
#include <unistd.h>

#include <atomic>
#include <cerrno>

namespace pemaro::frames {
namespace {

/// Gives a file the owner of another one.
bool adopt(int fd, const struct stat& old) {
    struct stat info {};
    return fstat(fd, &info) == 0 && ((info.st_uid == old.st_uid && info.st_gid == old.st_gid) ||
                                     fchown(fd, old.st_uid, old.st_gid) == 0);
}

}  // namespace

bool Draft::open(const std::string& path, const struct stat* old) {
    static std::atomic<unsigned int> last{0};
    if (!android::base::Realpath(path, &mTarget)) {
        mTarget = path;
    }
    std::string draft;
    do {
        draft = mTarget + "." + std::to_string(getpid()) + "." + std::to_string(++last) + ".new";
        mFd.reset(::open(draft.c_str(), O_RDWR | O_CREAT | O_EXCL | O_CLOEXEC,
                         old == nullptr ? 0666 : 0600));
    } while (!mFd.ok() && errno == EEXIST);
    if (!mFd.ok()) {
        return false;
    }
    mPath = draft;
    if (old == nullptr) {
        return true;
    }
    mMode = old->st_mode & 07777;
    if (adopt(mFd.get(), *old)) {
        return true;
    }
    drop();
    errno = EPERM;
    return false;
}

bool Draft::commit() {
    const bool isReady = !mMode || (fchmod(mFd.get(), *mMode) == 0 && fsync(mFd.get()) == 0);
    if (!isReady || rename(mPath.c_str(), mTarget.c_str()) != 0) {
        return false;
    }
    mPath.clear();
    return true;
}

bool Draft::close() {
    return ::close(mFd.release()) == 0;
}

void Draft::drop() {
    if (!mPath.empty()) {
        unlink(mPath.c_str());
        mPath.clear();
    }
    mFd.reset();
}

}  // namespace pemaro::frames
