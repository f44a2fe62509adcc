// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string_view>

/// The pieces of the text form that both its reader and the exported helpers are made of. Positions
/// are pointers into a text that ends before `limit`.
namespace pemaro {

/// Logs a failure of the reader.
void logReadError(const char* message);

constexpr bool isTextSpace(char c) {
    return c == ' ' || c == '\t' || c == '\r' || c == '\n' || c == '\v' || c == '\f';
}

/// Whether the double quote at `at` is an escaped one: preceded by a backslash, however many of
/// them.
inline bool isEscaped(const char* at) {
    return at[-1] == '\\';
}

/// The token without white space around it; the token itself when it has nothing else.
std::string_view trimSpaces(std::string_view token);

/// The tag of a trimmed scalar token. An empty one is fatal.
int scalarType(std::string_view token);

struct FoundKey {
    std::string_view key;
    const char* colon;
};

/// Finds the next key and the colon after it at or after `from`; logs and returns false when there
/// is none.
bool scanKey(const char* from, const char* limit, FoundKey& found);

}  // namespace pemaro
