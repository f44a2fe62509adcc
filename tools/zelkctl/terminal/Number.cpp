// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/terminal/Number.h"

#include <cctype>
#include <cerrno>
#include <cstdlib>

#include "tools/zelkctl/terminal/Report.h"

namespace pemaro::zelkctl {

std::optional<int64_t> parseNumber(const std::string& text, NumberRange range) {
    // strtoll would skip white space, and take a plus sign.
    const size_t digits = text[0] == '-' ? 1 : 0;
    if (isdigit(static_cast<unsigned char>(text[digits])) == 0) {
        return std::nullopt;
    }
    char* end = nullptr;
    errno = 0;
    const int64_t number = strtoll(text.c_str(), &end, 0);
    const bool whole = end == text.c_str() + text.size();
    if (!whole || errno != 0 || number < range.least || number > range.most) {
        return std::nullopt;
    }
    return number;
}

std::optional<int64_t> readNumber(const std::string& command, const std::string& name,
                                  const std::string& text, NumberRange range) {
    const auto number = parseNumber(text, range);
    if (!number) {
        failStatus(command, STATUS_ERROR_PARSING_PARAMETER,
                   fmt::format("{}: '{}' is no number from {} to {}", name, text, range.least,
                               range.most));
    }
    return number;
}

bool checkNumbers(const std::string& command, const std::string& list) {
    for (size_t start = 0, end = 0; end != std::string::npos; start = end + 1) {
        end = list.find(' ', start);
        const size_t length = end == std::string::npos ? end : end - start;
        if (!readNumber(command, "number", list.substr(start, length), kAny32)) {
            return false;
        }
    }
    return true;
}

}  // namespace pemaro::zelkctl
