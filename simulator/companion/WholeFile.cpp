// SPDX-License-Identifier: Apache-2.0
#include "simulator/companion/WholeFile.h"

#include <android-base/file.h>
#include <android-base/unique_fd.h>
#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>

#include "frames/Draft.h"
#include "pemaro/Status.h"

namespace pemaro::simulator {
namespace {

using android::base::unique_fd;

int writeInPlace(const std::string& path, const std::string& bytes, int flags) {
    unique_fd file(open(path.c_str(), O_WRONLY | O_CLOEXEC | O_NONBLOCK | O_NOCTTY | flags));
    if (!file.ok()) {
        return STATUS_ERROR_OPENING_FILE;
    }
    const bool written = android::base::WriteStringToFd(bytes, file);
    return close(file.release()) == 0 && written ? STATUS_NO_ERROR : STATUS_ERROR_WRITING_TO_FILE;
}

}  // namespace

int writeWholeFile(const std::string& path, const std::string& bytes) {
    struct stat old {};
    const bool isThere = stat(path.c_str(), &old) == 0;
    if (isThere && !S_ISREG(old.st_mode)) {
        return writeInPlace(path, bytes, 0);
    }
    // A file that must not be written must not be replaced either, nor a link to nothing.
    if (isThere ? access(path.c_str(), W_OK) != 0 : lstat(path.c_str(), &old) == 0) {
        return STATUS_ERROR_OPENING_FILE;
    }
    frames::Draft draft;
    if (!draft.open(path, isThere ? &old : nullptr)) {
        // It is another's, who keeps it.
        return isThere && errno == EPERM ? writeInPlace(path, bytes, O_TRUNC)
                                         : STATUS_ERROR_OPENING_FILE;
    }
    const bool written = android::base::WriteStringToFd(bytes, draft.fd()) && draft.commit();
    return written && draft.close() ? STATUS_NO_ERROR : STATUS_ERROR_WRITING_TO_FILE;
}

}  // namespace pemaro::simulator
