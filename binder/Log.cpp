// SPDX-License-Identifier: Apache-2.0
#include "binder/Log.h"

namespace pemaro {

void logText(android_LogPriority priority, const char* tag, const char* text) {
    if (text != nullptr) {
        __android_log_print(priority, tag, "%s", text);
    }
}

}  // namespace pemaro
