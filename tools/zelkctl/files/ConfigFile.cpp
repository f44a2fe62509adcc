// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/files/ConfigFile.h"

#include <android-base/file.h>
#include <android-base/unique_fd.h>
#include <fcntl.h>
#include <fmt/core.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <memory>

#include "tools/common/StandardOutput.h"
#include "tools/zelkctl/terminal/Output.h"

namespace pemaro::zelkctl {
namespace {

using File = std::unique_ptr<FILE, int (*)(FILE*)>;

FileResult failure(int status, const std::string& path) {
    return {status, path + ": " + strerror(errno)};
}

/// Writes to what is there already: what a device or a FIFO is stays what it is.
FileResult writeInPlace(const std::string& path, const std::string& bytes) {
    const android::base::unique_fd file(open(path.c_str(), O_WRONLY | O_CLOEXEC));
    if (!file.ok()) {
        return failure(STATUS_ERROR_OPENING_FILE, path);
    }
    return android::base::WriteStringToFd(bytes, file)
                   ? FileResult()
                   : failure(STATUS_ERROR_WRITING_TO_FILE, path);
}

/// Where a link leads to, so that it stays a link; the path itself when it is none.
std::string withoutLinks(const std::string& path) {
    const std::unique_ptr<char, decltype(&free)> target(realpath(path.c_str(), nullptr), &free);
    return target == nullptr ? path : target.get();
}

}  // namespace

FileResult readConfigFile(const std::string& path, size_t limit, std::string& bytes) {
    const File file(fopen(path.c_str(), "rbe"), fclose);
    if (file == nullptr) {
        return failure(STATUS_ERROR_OPENING_FILE, path);
    }
    bytes.resize(limit + 1);
    bytes.resize(fread(&bytes[0], 1, bytes.size(), file.get()));
    if (ferror(file.get()) != 0) {
        return failure(STATUS_ERROR_READING_FILE, path);
    }
    if (bytes.size() > limit) {
        return {STATUS_DATA_EXCEEDS_BUFFER,
                fmt::format("{} has more than {} bytes, the most that a transaction carries", path,
                            limit)};
    }
    return {};
}

FileResult writeConfigFile(const std::string& path, const std::string& bytes) {
    if (path == kStandardOutput) {
        return tools::writeOutput(bytes)
                       ? FileResult()
                       : FileResult{STATUS_ERROR_WRITING_TO_FILE, tools::outputProblem()};
    }
    struct stat info {};
    const bool isThere = stat(path.c_str(), &info) == 0;
    struct stat link {};
    const bool leadsNowhere = !isThere && lstat(path.c_str(), &link) == 0;
    if (isThere && !S_ISREG(info.st_mode)) {
        return writeInPlace(path, bytes);
    }
    if (leadsNowhere) {
        return {STATUS_ERROR_OPENING_FILE, path + " is a link to nothing"};
    }
    const std::string target = withoutLinks(path);
    const std::string draft = fmt::format("{}.{}.new", target, getpid());
    const android::base::unique_fd file(
            open(draft.c_str(), O_WRONLY | O_CREAT | O_EXCL | O_CLOEXEC, 0644));
    if (!file.ok()) {
        return failure(STATUS_ERROR_OPENING_FILE, path);
    }
    // Who may read the old one may read the new one, and nobody else.
    if ((isThere && fchmod(file.get(), info.st_mode & 07777) != 0) ||
        !android::base::WriteStringToFd(bytes, file) || fsync(file.get()) != 0 ||
        rename(draft.c_str(), target.c_str()) != 0) {
        const FileResult result = failure(STATUS_ERROR_WRITING_TO_FILE, path);
        unlink(draft.c_str());
        return result;
    }
    return {};
}

}  // namespace pemaro::zelkctl
