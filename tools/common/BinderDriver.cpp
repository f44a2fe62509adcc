// SPDX-License-Identifier: Apache-2.0
#include "tools/common/BinderDriver.h"

#include <android-base/unique_fd.h>
#include <binder/ProcessState.h>
#include <fcntl.h>

#include <cerrno>
#include <cstring>

namespace pemaro::tools {

std::string binderProblem() {
    const android::base::unique_fd driver(open("/dev/binder", O_RDWR | O_CLOEXEC));
    if (!driver.ok()) {
        return std::string("cannot use the Binder driver /dev/binder: ") + strerror(errno);
    }
    if (android::ProcessState::self()->getContextObject(nullptr) == nullptr) {
        return "no service manager is running";
    }
    return "";
}

}  // namespace pemaro::tools
