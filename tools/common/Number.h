// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstdint>
#include <optional>
#include <string>

namespace pemaro::tools {

/// Numbers from `least` to `most`.
struct NumberRange {
    int64_t least;
    int64_t most;
};

constexpr NumberRange kSigned32{INT32_MIN, INT32_MAX};
constexpr NumberRange kUnsigned32{0, UINT32_MAX};
/// All that 32 bits can mean, with a sign or without.
constexpr NumberRange kAny32{INT32_MIN, UINT32_MAX};

/// Numbers with a fraction, from `least` to `most`.
struct DecimalRange {
    double least;
    double most;
};

/// Reads a number as C writes one: decimal, 0x for hexadecimal, a leading 0 for octal. The whole
/// text has to be a number of the range; no space is skipped.
std::optional<int64_t> parseNumber(const std::string& text, NumberRange range);

/// Reads a decimal number, with a fraction or an exponent if need be. The same holds; what stands
/// for no number or for an infinite one is none.
std::optional<double> parseDecimal(const std::string& text, DecimalRange range);

/// What is wrong with a text that is to be such a number; empty when nothing is.
std::string numberProblem(const std::string& text, NumberRange range);
std::string decimalProblem(const std::string& text, DecimalRange range);

/// What is wrong with the options --first and --last; empty when nothing is.
std::string orderProblem(int64_t first, int64_t last);

/// The first thing that is wrong in a list of 32-bit numbers with single spaces between; empty when
/// nothing is. The library would take what is no number for 0.
std::string numberListProblem(const std::string& list);

}  // namespace pemaro::tools
