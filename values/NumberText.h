// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstdint>
#include <string>

/// Numbers to text and back: the results of snprintf and sscanf in the C locale, without their
/// cost.
namespace pemaro {

/// `%u` and `%d`.
std::string formatUnsigned(uint32_t value);
std::string formatSigned(int32_t value);

/// `%f` of the value widened to double.
std::string formatFloat(float value);

/// `%u`, `%d` and `%f`: true and `value` set when a number stands at the start of `text`, white
/// space before it and anything behind it disregarded; false and `value` untouched otherwise. An
/// integer that is too large keeps its low 32 bits; one beyond 64 bits first becomes the last that
/// they hold, so that `%d` reads 99999999999999999999 as -1 and its negative as 0, and `%u` both as
/// 4294967295. A 16-bit `%hu` or `%hd` is the low half of what these give.
bool scanUnsigned(const char* text, uint32_t& value);
bool scanSigned(const char* text, int32_t& value);
bool scanFloat(const char* text, float& value);

}  // namespace pemaro
