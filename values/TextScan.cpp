// SPDX-License-Identifier: Apache-2.0
#define LOG_TAG "SerializableMap"

#include "values/TextScan.h"

#include <log/log.h>

#include <cstring>

#include "pemaro/SerializableValue.h"

namespace pemaro {

namespace {

/// The first `c` in [from, limit), or null.
const char* findChar(const char* from, const char* limit, char c) {
    if (from >= limit) return nullptr;
    return static_cast<const char*>(memchr(from, c, static_cast<size_t>(limit - from)));
}

const char* findClosingQuote(const char* from, const char* limit) {
    const char* quote = findChar(from, limit, '"');
    while (quote != nullptr && isEscaped(quote)) quote = findChar(quote + 1, limit, '"');
    return quote;
}

bool scanKeyQuietly(const char* from, const char* limit, FoundKey& found) {
    const char* const open = findChar(from, limit, '"');
    if (open == nullptr) return false;
    // The character after the opening quote is never the closing one: there is no empty key.
    const char* const close = findClosingQuote(open + 2, limit);
    if (close == nullptr) return false;
    const char* const colon = findChar(close, limit, ':');
    if (colon == nullptr) return false;
    found.key = std::string_view(open + 1, static_cast<size_t>(close - open - 1));
    found.colon = colon;
    return true;
}

}  // namespace

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
    if (token == "true" || token == "false" || token == "null") return VALUE_TYPE_BOOL;
    LOG_ALWAYS_FATAL_IF(token.empty(), "a scalar has no text");
    if (token.front() == '-') return VALUE_TYPE_UINT32;
    if (token.front() == '"' && token.back() == '"') return VALUE_TYPE_STRING;
    return token.front() == '.' ? VALUE_TYPE_INT32 : VALUE_TYPE_FLOAT;
}

bool scanKey(const char* from, const char* limit, FoundKey& found) {
    if (scanKeyQuietly(from, limit, found)) return true;
    logReadError("invalid format (a colon must follow key in map)");
    return false;
}

}  // namespace pemaro
