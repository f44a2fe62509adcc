// SPDX-License-Identifier: Apache-2.0
#include "companion/StubDispatch.h"

#include <log/log.h>

namespace pemaro {

void logAccepted(const char* tag, const char* text) {
    __android_log_print(ANDROID_LOG_DEBUG, tag, "%s", text);
}

}  // namespace pemaro
