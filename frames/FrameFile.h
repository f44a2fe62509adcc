// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <sys/types.h>

#include <cstddef>
#include <string>

namespace pemaro::frames {

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
    int mFd = -1;
    off_t mEnd = 0;
};

}  // namespace pemaro::frames
