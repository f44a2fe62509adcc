// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <android-base/unique_fd.h>
#include <sys/stat.h>

#include <string>

#include "frames/Draft.h"
#include "tools/zelkctl/files/FileResult.h"

namespace pemaro::zelkctl {

/// Where a command writes a whole that it makes: a file, or the standard output, which is called "-".
///
/// A file is written as a frames::Draft and takes its place in close(), with the owner and the
/// permissions of the one that is there; one that is not closed is taken back. What a link leads to is
/// replaced and not the link; what is no file, a device or a FIFO, is written to, and what
/// a descriptor leads to, such as /dev/fd/3, is added to.
///
/// Where nothing can be written beside a file, or nothing can take its place, for its folder is not
/// to be written, it is mounted, or its owner is another one, it is written to as well. It stays what
/// it was until there is something to write, but then what was there is gone at once: a failure, or a
/// signal, leaves a part of the new one, and whoever reads it meanwhile sees a part.
///
/// What grows record by record instead, and is worth having at any time, is a frames::FrameFile.
class OutputFile {
  public:
    /// False, with the reason in problem(), when nothing can be written there, or when that is the
    /// file which the descriptor `input` reads, from which the bytes come. Waits for the reader of a
    /// FIFO.
    bool open(const std::string& path, int input = -1);

    /// Adds to it. False after the first failure, and then nothing is written any more.
    bool write(const std::string& bytes);

    /// Writes what is still held back and puts the file in its place; false when something did not
    /// reach it, and then what was there is there still, unless it had to be written to.
    bool close();

    /// The first failure.
    const FileResult& result() const { return mResult; }
    /// The same in one sentence; empty as long as there is none.
    std::string problem() const;

  private:
    bool openDescriptor(int descriptor);
    bool openInPlace(bool isRegular);
    bool openDraft(const struct stat* old);
    bool begin();
    bool flush();
    bool replace();
    bool copyDraft();
    const android::base::unique_fd& file() const { return mDraft.fd().ok() ? mDraft.fd() : mFd; }
    bool fail(int status);

    std::string mPath;
    std::string mHeld;
    FileResult mResult;
    frames::Draft mDraft;
    bool mIsNew = false;           ///< what the draft becomes
    android::base::unique_fd mFd;  ///< of what is written in place, or through a descriptor
    /// What a file holds that is written in place is still to give way.
    bool mMustEmpty = false;
    bool mIsStandardOutput = false;
};

}  // namespace pemaro::zelkctl
