// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <android-base/unique_fd.h>

#include <string>

namespace pemaro::zelkctl {

/// Where a command writes what it makes: a file, or the standard output, which is called "-".
class OutputFile {
  public:
    /// Creates or empties the file; false, with the reason in problem(), when it cannot.
    bool open(const std::string& path);

    /// Adds to it. False after the first failure, and then nothing is written any more.
    bool write(const std::string& text);

    /// Writes what is still held back and closes the file; false when something did not reach it.
    bool close();

    /// The first failure, told with the file's name; empty as long as there is none.
    const std::string& problem() const { return mProblem; }

  private:
    bool flush();
    bool fail(const char* what);

    std::string mPath;
    std::string mHeld;
    std::string mProblem;
    android::base::unique_fd mFd;
};

}  // namespace pemaro::zelkctl
