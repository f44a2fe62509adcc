// SPDX-License-Identifier: Apache-2.0
#include "tools/common/BinderDriver.h"

#include <binder/ProcessState.h>
#include <fcntl.h>
#include <unistd.h>

#include <cerrno>
#include <cstring>

namespace pemaro::tools {

std::string binderProblem() {
    const int fd = open("/dev/binder", O_RDWR | O_CLOEXEC);
    if (fd < 0) {
        return std::string("cannot use the Binder driver /dev/binder: ") + strerror(errno);
    }
    close(fd);
    if (android::ProcessState::self()->getContextObject(nullptr) == nullptr) {
        return "no service manager is running";
    }
    return "";
}

}  // namespace pemaro::tools
