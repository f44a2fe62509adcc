// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <memory>
#include <string>

#include "simulator/companion/FrameSink.h"

namespace pemaro::simulator {

/// A recording to a file: the frames, one after another, each of its own length.
class FileWriter : public FrameSink {
  public:
    /// Creates or empties the file; null when it cannot be opened. Never waits for a pipe.
    static std::shared_ptr<FileWriter> open(const std::string& path);

    ~FileWriter() override;

    bool put(const void* frame, size_t length) override;

  private:
    explicit FileWriter(int fd) : mFd(fd) {}

    const int mFd;
};

}  // namespace pemaro::simulator
