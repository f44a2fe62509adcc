// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <android-base/unique_fd.h>

#include <cstddef>
#include <string>

namespace pemaro::frames {

enum class Appended {
    kWhole,
    kNothing,
    kPart,  ///< of a pipe, which has nothing to take back
};

/// Writes a frame to a file. One that does not fit whole (the disk is full) is taken back, so that the
/// file stays readable frame by frame; errno tells why.
Appended appendFrame(int fd, const void* frame, size_t length);

/// A file of raw frames, one after another. It never keeps a part of a frame.
class FrameFile {
  public:
    ~FrameFile();

    /// Creates or empties the file; false, with the reason in problem(), when it cannot.
    bool open(const std::string& path);

    /// Adds a frame. False after the first failure, and then nothing is written any more.
    bool write(const void* frame, size_t length);

    /// Closes the file; false when something written before did not reach it.
    bool close();

    /// The first failure, told with the file's name; empty as long as there is none.
    const std::string& problem() const { return mProblem; }

  private:
    bool fail(const char* what);

    std::string mPath;
    std::string mProblem;
    android::base::unique_fd mFd;
};

}  // namespace pemaro::frames
