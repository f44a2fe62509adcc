// SPDX-License-Identifier: Apache-2.0
#include "companion/StubDispatch.h"

#include <log/log.h>

namespace pemaro {

void logTransaction(const char* tag, const char* text) {
    if (text != nullptr) {
        __android_log_print(ANDROID_LOG_DEBUG, tag, "%s", text);
    }
}

}  // namespace pemaro
