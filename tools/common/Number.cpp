// SPDX-License-Identifier: Apache-2.0
#include "tools/common/Number.h"

#include <fmt/core.h>

#include <cctype>
#include <cerrno>
#include <cmath>
#include <cstdlib>

namespace pemaro::tools {
namespace {

/// strtoll and strtod would skip white space, and take a plus sign and names of numbers.
bool beginsWithDigit(const std::string& text) {
    const size_t first = text[0] == '-' ? 1 : 0;
    return isdigit(static_cast<unsigned char>(text[first])) != 0;
}

bool isWhole(const std::string& text, const char* end) {
    return end == text.c_str() + text.size();
}

}  // namespace

std::optional<int64_t> parseNumber(const std::string& text, NumberRange range) {
    if (!beginsWithDigit(text)) {
        return std::nullopt;
    }
    char* end = nullptr;
    errno = 0;
    const int64_t number = strtoll(text.c_str(), &end, 0);
    if (!isWhole(text, end) || errno != 0 || number < range.least || number > range.most) {
        return std::nullopt;
    }
    return number;
}

std::optional<double> parseDecimal(const std::string& text, DecimalRange range) {
    // strtod reads hexadecimal numbers as well, which nobody means here.
    if (!beginsWithDigit(text) || text.find_first_of("xX") != std::string::npos) {
        return std::nullopt;
    }
    char* end = nullptr;
    const double number = strtod(text.c_str(), &end);
    if (!isWhole(text, end) || !std::isfinite(number) || number < range.least ||
        number > range.most) {
        return std::nullopt;
    }
    return number;
}

std::string numberProblem(const std::string& text, NumberRange range) {
    return parseNumber(text, range)
                   ? ""
                   : fmt::format("'{}' is no number from {} to {}", text, range.least, range.most);
}

std::string decimalProblem(const std::string& text, DecimalRange range) {
    return parseDecimal(text, range) ? ""
                                     : fmt::format("'{}' is no number from {:.10g} to {:.10g}",
                                                   text, range.least, range.most);
}

std::string orderProblem(int64_t first, int64_t last) {
    return first > last ? fmt::format("--first: {} is behind --last, {}", first, last) : "";
}

std::string numberListProblem(const std::string& list) {
    for (size_t start = 0, end = 0; end != std::string::npos; start = end + 1) {
        end = list.find(' ', start);
        const size_t length = end == std::string::npos ? end : end - start;
        std::string wrong = numberProblem(list.substr(start, length), kAny32);
        if (!wrong.empty()) {
            return wrong;
        }
    }
    return "";
}

}  // namespace pemaro::tools
