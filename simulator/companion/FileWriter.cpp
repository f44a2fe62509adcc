// SPDX-License-Identifier: Apache-2.0
#include "simulator/companion/FileWriter.h"

#include <fcntl.h>
#include <unistd.h>

namespace pemaro::simulator {

std::shared_ptr<FileWriter> FileWriter::open(const std::string& path) {
    const int flags = O_WRONLY | O_CREAT | O_TRUNC | O_CLOEXEC | O_NONBLOCK;
    const int fd = ::open(path.c_str(), flags, 0644);
    return fd < 0 ? nullptr : std::shared_ptr<FileWriter>(new FileWriter(fd));
}

FileWriter::~FileWriter() {
    ::close(mFd);
}

bool FileWriter::put(const void* frame, size_t length) {
    const ssize_t written = ::write(mFd, frame, length);
    if (written == static_cast<ssize_t>(length)) {
        return true;
    }
    // A frame that did not fit whole (the disk is full) is taken back, so that the file stays
    // readable frame by frame.
    if (written > 0) {
        const off_t end = ::lseek(mFd, -written, SEEK_CUR);
        if (end < 0 || ::ftruncate(mFd, end) != 0) {
            return false;
        }
    }
    return false;
}

}  // namespace pemaro::simulator
