// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstring>
#include <string_view>

#include "pemaro/SerializableValue.h"

/// The pieces of the text form that both its reader and the exported helpers are made of. Positions
/// are pointers into a text that ends before `limit`.
namespace pemaro {

/// Logs a failure of the reader.
void logReadError(const char* message);

constexpr bool isTextSpace(char c) {
    return c == ' ' || c == '\t' || c == '\r' || c == '\n' || c == '\v' || c == '\f';
}

/// What a character may mean to a scan, as bits.
enum TextClass : unsigned char {
    kMayEndToken = 1,  ///< a comma, a double quote, a closing bracket or the NUL behind the text
    kMayMatch = 2,     ///< a double quote, any bracket or that NUL
    kOpensNested = 4,  ///< an opening bracket
};

struct TextClasses {
    unsigned char of[256] = {};

    constexpr TextClasses() {
        for (const char c : {',', '"', ']', '}', '\0'}) add(c, kMayEndToken);
        for (const char c : {'"', '{', '}', '[', ']', '\0'}) add(c, kMayMatch);
        for (const char c : {'{', '['}) add(c, kOpensNested);
    }
    constexpr void add(char c, unsigned char bit) {
        of[static_cast<unsigned char>(c)] =
                static_cast<unsigned char>(of[static_cast<unsigned char>(c)] | bit);
    }
    constexpr bool is(char c, TextClass bit) const {
        return (of[static_cast<unsigned char>(c)] & bit) != 0;
    }
    /// The first character at or after `at` that has the bit; one has to be there.
    const char* find(const char* at, TextClass bit) const {
        for (;; at += 4) {
            if (is(at[0], bit)) return at;
            if (is(at[1], bit)) return at + 1;
            if (is(at[2], bit)) return at + 2;
            if (is(at[3], bit)) return at + 3;
        }
    }
};

inline constexpr TextClasses kTextClasses;

/// Whether the double quote at `at` is an escaped one: preceded by a backslash, however many of
/// them.
inline bool isEscaped(const char* at) {
    return at[-1] == '\\';
}

/// The first `c` in [from, limit), or null.
inline const char* findChar(const char* from, const char* limit, char c) {
    if (from >= limit) return nullptr;
    return static_cast<const char*>(memchr(from, c, static_cast<size_t>(limit - from)));
}

/// The first double quote in [from, limit) that is not an escaped one, or null.
inline const char* findQuote(const char* from, const char* limit) {
    const char* quote = findChar(from, limit, '"');
    while (quote != nullptr && isEscaped(quote)) quote = findChar(quote + 1, limit, '"');
    return quote;
}

/// The token without white space around it; the token itself when it has nothing else.
std::string_view trimSpaces(std::string_view token);

/// The tag of a trimmed scalar token. An empty one is fatal.
int scalarType(std::string_view token);

/// The same for a token that is not empty.
inline int typeOfScalar(std::string_view token) {
    switch (token.front()) {
        case '-':
            return VALUE_TYPE_UINT32;
        case '.':
            return VALUE_TYPE_INT32;
        case '"':
            return token.back() == '"' ? VALUE_TYPE_STRING : VALUE_TYPE_FLOAT;
        case 't':
            return token == "true" ? VALUE_TYPE_BOOL : VALUE_TYPE_FLOAT;
        case 'f':
            return token == "false" ? VALUE_TYPE_BOOL : VALUE_TYPE_FLOAT;
        case 'n':
            return token == "null" ? VALUE_TYPE_BOOL : VALUE_TYPE_FLOAT;
        default:
            return VALUE_TYPE_FLOAT;
    }
}

struct FoundKey {
    std::string_view key;
    const char* colon;
};

/// Finds the next key and the colon after it at or after `from`.
inline bool findKey(const char* from, const char* limit, FoundKey& found) {
    const char* const open = from < limit && *from == '"' ? from : findChar(from, limit, '"');
    if (open == nullptr) return false;
    // The character after the opening quote is never the closing one: there is no empty key.
    const char* const close = findQuote(open + 2, limit);
    if (close == nullptr) return false;
    const char* const colon =
            limit - close > 1 && close[1] == ':' ? close + 1 : findChar(close, limit, ':');
    if (colon == nullptr) return false;
    found.key = std::string_view(open + 1, static_cast<size_t>(close - open - 1));
    found.colon = colon;
    return true;
}

/// Logs that findKey() failed.
void logMissingKey();

}  // namespace pemaro
