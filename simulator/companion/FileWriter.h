// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <android-base/unique_fd.h>

#include <memory>
#include <string>
#include <utility>

#include "simulator/companion/FrameSink.h"

namespace pemaro::simulator {

/// A recording to a file: the frames, one after another, each of its own length.
class FileWriter : public FrameSink {
  public:
    /// Creates or empties the file; null when it cannot be opened. Never waits for a pipe.
    static std::shared_ptr<FileWriter> open(const std::string& path);

    bool put(const void* frame, size_t length) override;

  private:
    explicit FileWriter(android::base::unique_fd fd) : mFd(std::move(fd)) {}

    const android::base::unique_fd mFd;
};

}  // namespace pemaro::simulator
