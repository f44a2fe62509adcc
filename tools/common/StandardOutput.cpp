// SPDX-License-Identifier: Apache-2.0
#include "tools/common/StandardOutput.h"

#include <fcntl.h>
#include <poll.h>
#include <unistd.h>

#include <algorithm>
#include <atomic>
#include <cerrno>
#include <chrono>
#include <cstring>
#include <mutex>
#include <thread>

namespace pemaro::tools {
namespace {

constexpr std::chrono::milliseconds kMoment(50);

std::mutex gWriting;
/// The errno of the first failure.
std::atomic<int> gFailure{0};

void noteFailure(int number) {
    int none = 0;
    gFailure.compare_exchange_strong(none, number);
}

/// Whether a write would not wait now; a pipe takes PIPE_BUF bytes then.
bool isReady(int fd) {
    pollfd entry{fd, POLLOUT, 0};
    return poll(&entry, 1, static_cast<int>(kMoment.count())) > 0;
}

/// 0, or the errno of what went wrong.
int writeAll(int fd, const char* data, size_t size, bool patient) {
    while (size > 0) {
        if (!patient && !isReady(fd)) {
            return EAGAIN;
        }
        const ssize_t written = write(fd, data, patient ? size : std::min<size_t>(size, 512));
        if (written >= 0) {
            data += written;
            size -= static_cast<size_t>(written);
        } else if (errno == EAGAIN) {
            // Somebody else made the stream one that does not wait.
            isReady(fd);
        } else if (errno != EINTR) {
            return errno;
        }
    }
    return 0;
}

}  // namespace

void openStandardStreams() {
    for (int fd = STDIN_FILENO; fd <= STDERR_FILENO; ++fd) {
        if (fcntl(fd, F_GETFD) < 0 && errno == EBADF) {
            // The lowest free number is this one.
            open("/dev/null", O_RDWR);
            if (fd == STDOUT_FILENO) {
                noteFailure(EBADF);
            }
        }
    }
}

bool writeOutput(const void* data, size_t size) {
    const std::lock_guard<std::mutex> guard(gWriting);
    if (gFailure == 0) {
        const int failure = writeAll(STDOUT_FILENO, static_cast<const char*>(data), size, true);
        if (failure != 0) {
            noteFailure(failure);
        }
    }
    return gFailure == 0;
}

bool writeOutput(const std::string& text) {
    return writeOutput(text.data(), text.size());
}

void tryWriteOutput(const std::string& text) {
    std::unique_lock<std::mutex> guard(gWriting, std::try_to_lock);
    const auto end = std::chrono::steady_clock::now() + kMoment;
    while (!guard.owns_lock() && std::chrono::steady_clock::now() < end) {
        std::this_thread::sleep_for(std::chrono::milliseconds(5));
        guard.try_lock();
    }
    if (guard.owns_lock() && gFailure == 0) {
        const int failure = writeAll(STDOUT_FILENO, text.data(), text.size(), false);
        if (failure != 0) {
            noteFailure(failure);
        }
    }
}

void noteOutputClosed() {
    noteFailure(EPIPE);
}

std::string outputProblem() {
    const int failure = gFailure;
    return failure == 0 ? ""
                        : std::string("cannot write the standard output: ") + strerror(failure);
}

void writeError(const std::string& line) {
    const std::string whole = line + "\n";
    writeAll(STDERR_FILENO, whole.data(), whole.size(), true);
}

}  // namespace pemaro::tools
