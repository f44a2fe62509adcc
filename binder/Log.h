// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <android/log.h>

namespace pemaro {

/// A text as it stands, at a priority and under a tag of the Android log; nothing for a null text.
void logText(android_LogPriority priority, const char* tag, const char* text);

}  // namespace pemaro
