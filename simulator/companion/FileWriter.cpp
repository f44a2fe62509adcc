// SPDX-License-Identifier: Apache-2.0
#include "simulator/companion/FileWriter.h"

#include <fcntl.h>

#include <utility>

#include "frames/FrameFile.h"

namespace pemaro::simulator {

std::shared_ptr<FileWriter> FileWriter::open(const std::string& path) {
    const int flags = O_WRONLY | O_CREAT | O_TRUNC | O_CLOEXEC | O_NONBLOCK;
    android::base::unique_fd fd(::open(path.c_str(), flags, 0644));
    return fd.ok() ? std::shared_ptr<FileWriter>(new FileWriter(std::move(fd))) : nullptr;
}

bool FileWriter::put(const void* frame, size_t length) {
    return frames::appendFrame(mFd.get(), frame, length) == frames::Appended::kWhole;
}

}  // namespace pemaro::simulator
