// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/files/InputFile.h"

#include <android-base/unique_fd.h>
#include <fcntl.h>
#include <unistd.h>

#include <cerrno>
#include <cstring>

namespace pemaro::zelkctl {
namespace {

FileResult failure(int status, const std::string& path) {
    return {status, path + ": " + strerror(errno)};
}

}  // namespace

FileResult readInputFile(const std::string& path, size_t most, std::string& bytes) {
    const android::base::unique_fd file(open(path.c_str(), O_RDONLY | O_CLOEXEC));
    if (!file.ok()) {
        return failure(STATUS_ERROR_OPENING_FILE, path);
    }
    bytes.resize(most);
    size_t length = 0;
    ssize_t got = 1;
    while (length < most && got > 0) {
        got = TEMP_FAILURE_RETRY(read(file.get(), &bytes[length], most - length));
        length += got > 0 ? static_cast<size_t>(got) : 0;
    }
    bytes.resize(length);
    return got < 0 ? failure(STATUS_ERROR_READING_FILE, path) : FileResult();
}

}  // namespace pemaro::zelkctl
