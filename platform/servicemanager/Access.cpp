// SPDX-License-Identifier: Apache-2.0
// Access control of servicemanager on a Linux desk: there is no SELinux policy to ask, every caller may
// find, add and list services.

#include "Access.h"

#include <binder/IPCThreadState.h>

namespace android {

Access::Access() = default;
Access::~Access() = default;

Access::CallingContext Access::getCallingContext() {
    IPCThreadState* caller = IPCThreadState::self();
    const char* sid = caller->getCallingSid();
    return {caller->getCallingPid(), caller->getCallingUid(), sid ? sid : "unknown"};
}

bool Access::canFind(const CallingContext&, const std::string&) {
    return true;
}

bool Access::canAdd(const CallingContext&, const std::string&) {
    return true;
}

bool Access::canList(const CallingContext&) {
    return true;
}

}  // namespace android
