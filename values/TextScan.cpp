// SPDX-License-Identifier: Apache-2.0
#define LOG_TAG "SerializableMap"

#include "values/TextScan.h"

#include <log/log.h>

#include "pemaro/SerializableValue.h"

namespace pemaro {

void logReadError(const char* message) {
    ALOGE("%s", message);
}

std::string_view trimSpaces(std::string_view token) {
    size_t first = 0;
    size_t end = token.size();
    while (first < end && isTextSpace(token[first])) ++first;
    if (first == end) return token;
    while (isTextSpace(token[end - 1])) --end;
    return token.substr(first, end - first);
}

int scalarType(std::string_view token) {
    LOG_ALWAYS_FATAL_IF(token.empty(), "a scalar has no text");
    return typeOfScalar(token);
}

void logMissingKey() {
    logReadError("invalid format (a colon must follow key in map)");
}

}  // namespace pemaro
