// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/files/OutputFile.h"

#include <android-base/file.h>
#include <fcntl.h>
#include <fmt/core.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <cstring>
#include <utility>

#include "frames/OwnDescriptor.h"
#include "tools/common/StandardOutput.h"
#include "tools/zelkctl/terminal/Output.h"
#include "tools/zelkctl/terminal/Supervisor.h"

namespace pemaro::zelkctl {
namespace {

constexpr size_t kHoldBack = 1 << 16;

/// Whether a plain write to the file may work although that next to it failed with this errno.
bool isFolders(int error) {
    return error == EACCES || error == EPERM || error == EROFS;
}

bool isSameFile(const struct stat& output, int input) {
    struct stat info {};
    return S_ISREG(output.st_mode) && input >= 0 && fstat(input, &info) == 0 &&
           info.st_dev == output.st_dev && info.st_ino == output.st_ino;
}

}  // namespace

bool OutputFile::open(const std::string& path, int input) {
    mPath = path;
    mIsStandardOutput = isStandardOutput(path);
    const int descriptor = mIsStandardOutput ? STDOUT_FILENO : frames::ownDescriptor(path);
    struct stat info {};
    const bool isThere =
            (descriptor >= 0 ? fstat(descriptor, &info) : stat(path.c_str(), &info)) == 0;
    if (isThere && isSameFile(info, input)) {
        mResult = {STATUS_ERROR_WRITING_TO_FILE,
                   (mIsStandardOutput ? "cannot write the standard output" : path) +
                           std::string(": it is the file that is read")};
        return false;
    }
    if (descriptor >= 0) {
        return mIsStandardOutput || openDescriptor(descriptor);
    }
    if (isThere && !S_ISREG(info.st_mode)) {
        return openInPlace(false);
    }
    // A file that must not be written must not be replaced either.
    if (isThere && access(path.c_str(), W_OK) != 0) {
        return fail(STATUS_ERROR_OPENING_FILE);
    }
    if (isThere) {
        return openDraft(&info);
    }
    if (lstat(path.c_str(), &info) == 0) {
        mResult = {STATUS_ERROR_OPENING_FILE, path + ": it is a link to nothing"};
        return false;
    }
    return openDraft(nullptr);
}

/// What the caller opened has its place in the file, or is at its end.
bool OutputFile::openDescriptor(int descriptor) {
    mFd.reset(fcntl(descriptor, F_DUPFD_CLOEXEC, 0));
    return mFd.ok() || fail(STATUS_ERROR_OPENING_FILE);
}

bool OutputFile::openInPlace(bool isRegular) {
    const Waiting waiting("while waiting for a reader of " + mPath);
    mFd.reset(::open(mPath.c_str(), O_WRONLY | O_CLOEXEC));
    mMustEmpty = isRegular;
    return mFd.ok() || fail(STATUS_ERROR_OPENING_FILE);
}

/// `old` is what is there, or null.
bool OutputFile::openDraft(const struct stat* old) {
    if (mDraft.open(mPath, old)) {
        mIsNew = old == nullptr;
        return true;
    }
    return old != nullptr && isFolders(errno) ? openInPlace(true) : fail(STATUS_ERROR_OPENING_FILE);
}

bool OutputFile::write(const std::string& bytes) {
    mHeld += bytes;
    return mHeld.size() < kHoldBack ? mResult.isGood() : flush();
}

bool OutputFile::flush() {
    const std::string held = std::move(mHeld);
    mHeld.clear();
    if (!mResult.isGood() || held.empty()) {
        return mResult.isGood();
    }
    const Waiting waiting("while writing " + mPath);
    if (mIsStandardOutput) {
        if (!tools::writeOutput(held)) {
            mResult = {STATUS_ERROR_WRITING_TO_FILE, tools::outputProblem()};
        }
        return mResult.isGood();
    }
    return begin() && (android::base::WriteFully(file(), held.data(), held.size()) ||
                       fail(STATUS_ERROR_WRITING_TO_FILE));
}

/// What a file held that is written in place gives way as late as that.
bool OutputFile::begin() {
    if (mMustEmpty && ftruncate(mFd.get(), 0) != 0) {
        return fail(STATUS_ERROR_WRITING_TO_FILE);
    }
    mMustEmpty = false;
    return true;
}

bool OutputFile::close() {
    if (!flush() || mIsStandardOutput) {
        return mResult.isGood();
    }
    if (mDraft.fd().ok()) {
        return replace();
    }
    return begin() && (::close(mFd.release()) == 0 || fail(STATUS_ERROR_WRITING_TO_FILE));
}

bool OutputFile::replace() {
    if (mDraft.commit()) {
        return mDraft.close() || fail(STATUS_ERROR_WRITING_TO_FILE);
    }
    // It is mounted, or its folder gives nothing up.
    if (!mIsNew && (errno == EBUSY || isFolders(errno))) {
        return copyDraft();
    }
    return fail(STATUS_ERROR_WRITING_TO_FILE);
}

bool OutputFile::copyDraft() {
    if (!openInPlace(true) || !begin()) {
        return false;
    }
    std::string bytes(kHoldBack, '\0');
    off_t offset = 0;
    ssize_t got = 0;
    while ((got = TEMP_FAILURE_RETRY(pread(mDraft.fd(), &bytes[0], bytes.size(), offset))) > 0) {
        if (!android::base::WriteFully(mFd, bytes.data(), static_cast<size_t>(got))) {
            return fail(STATUS_ERROR_WRITING_TO_FILE);
        }
        offset += got;
    }
    if (got < 0 || ::close(mFd.release()) != 0) {
        return fail(STATUS_ERROR_WRITING_TO_FILE);
    }
    mDraft.drop();
    return true;
}

bool OutputFile::fail(int status) {
    mResult = {status, mPath + ": " + strerror(errno)};
    return false;
}

std::string OutputFile::problem() const {
    if (mResult.isGood() || mIsStandardOutput) {
        return mResult.detail;
    }
    const char* what = mResult.status == STATUS_ERROR_OPENING_FILE ? "open" : "write";
    return fmt::format("cannot {} {}", what, mResult.detail);
}

}  // namespace pemaro::zelkctl
