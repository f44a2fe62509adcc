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

#include "tools/common/StandardOutput.h"
#include "tools/zelkctl/terminal/Output.h"
#include "tools/zelkctl/terminal/Supervisor.h"

namespace pemaro::zelkctl {
namespace {

constexpr size_t kHoldBack = 1 << 16;

}  // namespace

OutputFile::~OutputFile() {
    if (!mDraft.empty()) {
        unlink(mDraft.c_str());
    }
}

bool OutputFile::open(const std::string& path) {
    mPath = path;
    mIsStandardOutput = path == kStandardOutput;
    if (mIsStandardOutput) {
        return true;
    }
    struct stat info {};
    if (stat(path.c_str(), &info) == 0) {
        if (!S_ISREG(info.st_mode)) {
            return openInPlace();
        }
        // A file that must not be written must not be replaced either.
        if (access(path.c_str(), W_OK) != 0) {
            return fail(STATUS_ERROR_OPENING_FILE);
        }
        mMode = info.st_mode & 07777;
    } else if (lstat(path.c_str(), &info) == 0) {
        mResult = {STATUS_ERROR_OPENING_FILE, path + ": it is a link to nothing"};
        return false;
    }
    return openDraft();
}

bool OutputFile::openInPlace() {
    const Waiting waiting("while waiting for a reader of " + mPath);
    mFd.reset(::open(mPath.c_str(), O_WRONLY | O_CLOEXEC));
    return mFd.ok() || fail(STATUS_ERROR_OPENING_FILE);
}

bool OutputFile::openDraft() {
    if (!android::base::Realpath(mPath, &mTarget)) {
        mTarget = mPath;
    }
    const std::string draft = fmt::format("{}.{}.new", mTarget, getpid());
    mFd.reset(::open(draft.c_str(), O_WRONLY | O_CREAT | O_EXCL | O_CLOEXEC, 0644));
    if (!mFd.ok()) {
        return fail(STATUS_ERROR_OPENING_FILE);
    }
    mDraft = draft;
    return true;
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
    return android::base::WriteFully(mFd, held.data(), held.size()) ||
           fail(STATUS_ERROR_WRITING_TO_FILE);
}

bool OutputFile::close() {
    if (!flush() || mIsStandardOutput) {
        return mResult.isGood();
    }
    return (mDraft.empty() || replace()) &&
           (::close(mFd.release()) == 0 || fail(STATUS_ERROR_WRITING_TO_FILE));
}

bool OutputFile::replace() {
    // Who may read the old one may read the new one, and nobody else. What is to be lost is replaced
    // by what is on the disk; where nothing is lost, that can wait.
    const bool isReady = !mMode || (fchmod(mFd.get(), *mMode) == 0 && fsync(mFd.get()) == 0);
    if (!isReady || rename(mDraft.c_str(), mTarget.c_str()) != 0) {
        return fail(STATUS_ERROR_WRITING_TO_FILE);
    }
    mDraft.clear();
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
