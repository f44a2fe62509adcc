// SPDX-License-Identifier: Apache-2.0
#include "managers/ManagerConnection.h"

namespace pemaro {

void logManagerDebug(const char* tag, const char* text) {
    __android_log_print(ANDROID_LOG_DEBUG, tag, "%s", text);
}

void logManagerError(const char* tag, const char* text) {
    __android_log_print(ANDROID_LOG_ERROR, tag, "%s", text);
}

}  // namespace pemaro
