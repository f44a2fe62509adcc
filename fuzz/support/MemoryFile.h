// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <sys/mman.h>
#include <unistd.h>

#include <string>

#include "fuzz/support/ParcelInput.h"

namespace pemaro::fuzz {

/// A file in memory with these bytes.
class MemoryFile {
  public:
    explicit MemoryFile(const std::string& bytes) : mFd(memfd_create("input", MFD_CLOEXEC)) {
        expect(write(mFd, bytes.data(), bytes.size()) == static_cast<ssize_t>(bytes.size()),
               "the file was not written");
    }
    ~MemoryFile() { close(mFd); }
    MemoryFile(const MemoryFile&) = delete;
    MemoryFile& operator=(const MemoryFile&) = delete;

    std::string path() const { return "/proc/self/fd/" + std::to_string(mFd); }

  private:
    const int mFd;
};

}  // namespace pemaro::fuzz
