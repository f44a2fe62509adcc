// SPDX-License-Identifier: Apache-2.0
#include "simulator/companion/WholeFile.h"

#include <android-base/file.h>
#include <android-base/unique_fd.h>
#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <atomic>
#include <cerrno>
#include <cstdio>

#include "pemaro/Status.h"

namespace pemaro::simulator {
namespace {

using android::base::unique_fd;

constexpr int kToWrite = O_WRONLY | O_CLOEXEC;

int writeInPlace(const std::string& path, const std::string& bytes, int flags) {
    unique_fd file(open(path.c_str(), kToWrite | O_NONBLOCK | O_NOCTTY | flags));
    if (!file.ok()) {
        return STATUS_ERROR_OPENING_FILE;
    }
    const bool written = android::base::WriteStringToFd(bytes, file);
    return close(file.release()) == 0 && written ? STATUS_NO_ERROR : STATUS_ERROR_WRITING_TO_FILE;
}

/// A file beside its place, under a name that no other has.
unique_fd openDraft(const std::string& target, mode_t mode, std::string* draft) {
    static std::atomic<unsigned int> last{0};
    unique_fd file;
    do {
        *draft = target + "." + std::to_string(getpid()) + "." + std::to_string(++last) + ".new";
        file.reset(open(draft->c_str(), kToWrite | O_CREAT | O_EXCL, mode));
    } while (!file.ok() && errno == EEXIST);
    return file;
}

}  // namespace

int writeWholeFile(const std::string& path, const std::string& bytes) {
    struct stat old {};
    const bool isThere = stat(path.c_str(), &old) == 0;
    if (isThere && !S_ISREG(old.st_mode)) {
        return writeInPlace(path, bytes, 0);
    }
    std::string target = path;
    // A file that must not be written must not be replaced either, nor a link to nothing.
    if (isThere ? access(path.c_str(), W_OK) != 0 || !android::base::Realpath(path, &target)
                : lstat(path.c_str(), &old) == 0) {
        return STATUS_ERROR_OPENING_FILE;
    }
    std::string draft;
    unique_fd file = openDraft(target, isThere ? 0600 : 0666, &draft);
    if (!file.ok()) {
        return STATUS_ERROR_OPENING_FILE;
    }
    if (isThere && fchown(file.get(), old.st_uid, old.st_gid) != 0) {
        // It is another's, who keeps it.
        unlink(draft.c_str());
        return writeInPlace(target, bytes, O_TRUNC);
    }
    // What is to be lost is replaced by what is on the disk; where nothing is lost, that can wait.
    const bool written =
            android::base::WriteStringToFd(bytes, file) &&
            (!isThere || (fchmod(file.get(), old.st_mode & 07777) == 0 && fsync(file.get()) == 0));
    if (close(file.release()) != 0 || !written || rename(draft.c_str(), target.c_str()) != 0) {
        unlink(draft.c_str());
        return STATUS_ERROR_WRITING_TO_FILE;
    }
    return STATUS_NO_ERROR;
}

}  // namespace pemaro::simulator
