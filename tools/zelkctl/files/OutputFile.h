// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <android-base/unique_fd.h>
#include <sys/types.h>

#include <optional>
#include <string>

#include "tools/zelkctl/files/FileResult.h"

namespace pemaro::zelkctl {

/// Where a command writes a whole that it makes: a file, or the standard output, which is called "-".
///
/// A file is written beside the one that is there and takes its place in close(), so that the old
/// one stays what it was until the new one is complete. What a link leads to is replaced and not
/// the link; what is no file, a device or a FIFO, is written to. What grows record by record
/// instead, and is worth having at any time, is a frames::FrameFile.
class OutputFile {
  public:
    /// Takes back a file that was not closed.
    ~OutputFile();

    /// False, with the reason in problem(), when nothing can be written there. Waits for the reader
    /// of a FIFO.
    bool open(const std::string& path);

    /// Adds to it. False after the first failure, and then nothing is written any more.
    bool write(const std::string& bytes);

    /// Writes what is still held back and puts the file in its place; false when something did not
    /// reach it, and then what was there is there still.
    bool close();

    /// The first failure.
    const FileResult& result() const { return mResult; }
    /// The same in one sentence; empty as long as there is none.
    std::string problem() const;

  private:
    bool openInPlace();
    bool openDraft();
    bool flush();
    bool replace();
    bool fail(int status);

    std::string mPath;
    std::string mTarget;  ///< without links
    std::string mDraft;   ///< empty for what is written in place
    std::string mHeld;
    FileResult mResult;
    android::base::unique_fd mFd;
    /// The permissions of the file that is there.
    std::optional<mode_t> mMode;
    bool mIsStandardOutput = false;
};

}  // namespace pemaro::zelkctl
