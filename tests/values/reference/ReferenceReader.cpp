// SPDX-License-Identifier: Apache-2.0
#include "tests/values/reference/ReferenceReader.h"

#include <algorithm>
#include <cstring>

namespace pemaro::reference {

namespace {

constexpr int kOk = 0;
constexpr int kInvalidFormat = 0x4000000C;

/// Thrown where the process ends.
struct Abort {};

bool isSpace(char c) {
    return c != '\0' && strchr(" \t\r\n\v\f", c) != nullptr;
}

std::string trim(const std::string& token) {
    const size_t first = token.find_first_not_of(" \t\r\n\v\f");
    const size_t last = token.find_last_not_of(" \t\r\n\v\f");
    if (first == std::string::npos || last == std::string::npos) return token;
    return token.substr(first, last - first + 1);
}

int typeOf(const std::string& token) {
    if (token == "true" || token == "false" || token == "null") return 11;
    if (token.empty()) throw Abort();
    if (token[0] == '-') return 5;
    if (token[0] == '"' && token[token.size() - 1] == '"') return 12;
    return token.find('.') == 0 ? 6 : 9;
}

/// The first `c` from `start` on that is not in a quoted stretch, up to the end of the text.
const char* findOutsideQuotes(const char* start, char c) {
    bool quoted = false;
    for (const char* at = start; *at != '\0'; ++at) {
        if (*at == '"' && *(at - 1) != '\\') quoted = !quoted;
        if (*at == c && !quoted) return at;
    }
    return nullptr;
}

/// The bracket that matches the one at `open`.
const char* findMatch(const char* open, char up, char down) {
    bool quoted = false;
    int depth = 0;
    for (const char* at = open; *at != '\0'; ++at) {
        if (at != open && *at == '"' && *(at - 1) != '\\') quoted = !quoted;
        if (quoted) continue;
        if (*at == up) ++depth;
        if (*at == down && --depth == 0) return at;
    }
    return nullptr;
}

class Reader {
  public:
    explicit Reader(Reading& reading) : mReading(reading) {}

    int map(const std::string& text, Tree& target);
    int array(const std::string& text, Tree& target);

  private:
    int fail(const char* message) {
        mReading.messages.push_back(message);
        return kInvalidFormat;
    }
    int failInSpace() {
        mReading.endedInSpace = true;
        return fail("invalid format: colon should follow value");
    }
    int findKey(const char* from, const char** colon, std::string& key);
    const char* scalar(const char* start, const char* position, const char* end, Tree& value);

    Reading& mReading;
};

int Reader::findKey(const char* from, const char** colon, std::string& key) {
    const char* const message = "invalid format (a colon must follow key in map)";
    const char* open = strchr(from, '"');
    if (open == nullptr) return fail(message);
    if (strchr(open + 1, '"') == nullptr) return fail(message);
    const char* close = open + 2;
    while (*close != '\0' && !(*close == '"' && *(close - 1) != '\\')) ++close;
    if (*close == '\0') return fail(message);
    const char* found = strchr(close, ':');
    if (found == nullptr) return fail(message);
    *colon = found;
    key = std::string(open + 1, close);
    return kOk;
}

const char* Reader::scalar(const char* start, const char* position, const char* end, Tree& value) {
    const char* tokenEnd = findOutsideQuotes(start, ',');
    if (tokenEnd == nullptr) {
        if (findOutsideQuotes(start, ']') == nullptr && findOutsideQuotes(start, '}') == nullptr) {
            mReading.messages.push_back("pemaro: ERROR");
            return position;
        }
        tokenEnd = end;
    }
    value.text = trim(std::string(start, tokenEnd));
    value.type = typeOf(value.text);
    if (value.type == 12) {
        value.text.erase(0, 1);
        if (!value.text.empty()) value.text.erase(value.text.size() - 1);
    }
    return tokenEnd;
}

void put(Tree& map, const std::string& key, const Tree& value) {
    const auto at = std::find_if(map.entries.begin(), map.entries.end(),
                                 [&](const auto& entry) { return !(entry.first < key); });
    if (at != map.entries.end() && at->first == key) {
        at->second = value;
    } else {
        map.entries.insert(at, {key, value});
    }
}

int Reader::map(const std::string& text, Tree& target) {
    Tree result;
    result.type = 13;
    const char* open = strchr(text.c_str(), '{');
    if (open == nullptr) return fail("invalid format (should start with a brace)");
    const char* end = strrchr(open, '}');
    if (end == nullptr) return fail("invalid format (should end with a brace)");
    const char* colon = nullptr;
    std::string key;
    if (findKey(open + 1, &colon, key) != kOk) return fail("invalid format: in key");
    for (;;) {
        const char* at = colon + 1;
        if (at >= end) break;
        while (isSpace(*at)) ++at;
        if (*at == '\0') return failInSpace();
        if (at >= end) break;
        Tree value;
        if (*at == '{') {
            const char* match = findMatch(at, '{', '}');
            if (match == nullptr) return fail("invalid map data");
            if (map(std::string(at, match + 1), value) != kOk) {
                return fail("invalid format: unserialize failed 1");
            }
            at = match;
        } else if (*at == '[') {
            const char* match = findMatch(at, '[', ']');
            if (match == nullptr) return fail("invalid array data");
            if (array(std::string(at, match + 1), value) != kOk) {
                return fail("invalid format: unserialize failed");
            }
            at = match;
        } else {
            at = scalar(at, at, end, value);
        }
        put(result, key, value);
        if (at + 1 >= end) break;
        ++at;
        while (isSpace(*at)) ++at;
        if (*at == '\0') return failInSpace();
        if (at >= end) break;
        if (findKey(at, &colon, key) != kOk) return fail("invalid format: in key");
    }
    target = result;
    return kOk;
}

int Reader::array(const std::string& text, Tree& target) {
    Tree result;
    result.type = 14;
    const char* open = strchr(text.c_str(), '[');
    if (open == nullptr) return fail("invalid format (should start with a bracket)");
    const char* end = strrchr(open, ']');
    if (end == nullptr) return fail("invalid format (should end with a bracket)");
    const char* at = open + 1;
    for (;;) {
        if (at < end) {
            while (isSpace(*at)) ++at;
            if (*at == '\0') return failInSpace();
        }
        if (at >= end) break;
        Tree value;
        if (*at == '{') {
            const char* match = findMatch(at, '{', '}');
            if (match == nullptr) return fail("invalid map data");
            if (map(std::string(at, match + 1), value) != kOk) {
                return fail("invalid format: unserialize array failed 1");
            }
            at = match + 2;
        } else if (*at == '[') {
            const char* match = findMatch(at, '[', ']');
            if (match == nullptr) return fail("invalid array data");
            if (array(std::string(at, match + 1), value) != kOk) {
                return fail("invalid format: unserialize array failed");
            }
            at = match + 2;
        } else {
            at = scalar(at, at, end, value) + 1;
        }
        result.elements.push_back(value);
    }
    target = result;
    return kOk;
}

Reading read(const std::string& text, int (Reader::*what)(const std::string&, Tree&)) {
    Reading reading;
    try {
        reading.status = (Reader(reading).*what)(text, reading.tree);
    } catch (const Abort&) {
        reading.aborts = true;
    }
    return reading;
}

}  // namespace

Reading readMap(const std::string& text) {
    return read(text, &Reader::map);
}

Reading readArray(const std::string& text) {
    return read(text, &Reader::array);
}

}  // namespace pemaro::reference
