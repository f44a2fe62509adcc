// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

namespace pemaro::zelkctl {

/// Numbers from `least` to `most`.
struct NumberRange {
    int64_t least;
    int64_t most;
};

constexpr NumberRange kSigned32{INT32_MIN, INT32_MAX};
constexpr NumberRange kUnsigned32{0, UINT32_MAX};
/// All that 32 bits can mean, with a sign or without.
constexpr NumberRange kAny32{INT32_MIN, UINT32_MAX};

/// Reads a number as C writes one: decimal, 0x for hexadecimal, a leading 0 for octal. The whole
/// text has to be a number of the range; no space is skipped.
std::optional<int64_t> parseNumber(const std::string& text, NumberRange range);

/// The same for an argument called `name`: when it is no such number, the user is told so.
std::optional<int64_t> readNumber(const std::string& command, const std::string& name,
                                  const std::string& text, NumberRange range);

/// Whether each word of a list with single spaces between is a number of 32 bits; the user is told
/// of the first that is not. The library would take what is no number for 0.
bool checkNumbers(const std::string& command, const std::string& list);

}  // namespace pemaro::zelkctl
