// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <android-base/unique_fd.h>

#include <atomic>
#include <cstddef>
#include <functional>
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

/// Raw frames, one after another, in a file, or to what is no file: a pipe, a device. The standard
/// output is called "-"; it, and what a path such as /dev/fd/3 names, is added to. It never keeps a
/// part of a frame in a file, and touches one that is there no sooner than there is something to
/// write. One thread at a time.
class FrameFile {
  public:
    ~FrameFile();

    /// Opens what is called `path`, through links, and creates it when it is not there; waits for
    /// the reader of a FIFO. False, with the reason in problem(), when it cannot, or when `giveUp`
    /// returns true; that is asked as well while whoever reads what is no file takes nothing. A file
    /// that another FrameFile has open, in any process, is refused.
    bool open(const std::string& path, std::function<bool()> giveUp = nullptr);

    /// Adds a frame; the first takes the place of what the file held. False after the first
    /// failure, and then nothing is written any more.
    bool write(const void* frame, size_t length);

    /// Closes the file; false when something written before did not reach it. A file to which
    /// nothing was written is empty then.
    bool close();

    /// The first failure, told with the file's name; empty as long as there is none.
    const std::string& problem() const { return mProblem; }

    /// Whether a frame is being written, from any thread.
    bool isWithinFrame() const { return mWithinFrame; }

  private:
    bool openFifo(const std::string& path);
    bool lock();
    bool begin();
    Appended appendToStream(const void* frame, size_t length);
    bool awaitRoom() const;
    bool givesUp() const { return mGiveUp && mGiveUp(); }
    bool fail(const char* what);

    std::string mPath;
    std::string mName;
    std::string mProblem;
    android::base::unique_fd mFd;
    std::function<bool()> mGiveUp;
    bool mIsFile = false;
    bool mIsCallers = false;  ///< a descriptor that was there before
    bool mIsCreated = false;
    bool mHasBegun = false;
    std::atomic<bool> mWithinFrame{false};
};

}  // namespace pemaro::frames
