// SPDX-License-Identifier: Apache-2.0

// How a float is written. A finite float is m * 2^e with m below 2^24 and e in -149 .. 104. For
// e >= 0 it is an integer below 2^128, written digit by digit. For e < 0, its six decimals are
// m * 10^6 / 2^-e rounded half to even; m * 10^6 is below 2^44, so 64 bits hold every step. No bit
// is lost on the way, which is what makes the result that of printf.
//
// How a float is read. A decimal number of at most 53 bits of mantissa m and at most 18 decimals k
// is m / 10^k, where both are exact doubles, so one division gives the double nearest to the
// number. Rounding that once more to float gives the float nearest to the number, except where the
// double lies exactly halfway between two floats: there the first rounding may have hidden on which
// side the number lies. Those, and all other shapes of numbers, go to sscanf.

#include "values/NumberText.h"

#include <locale.h>

#include <cfloat>
#include <cmath>
#include <cstdio>
#include <cstring>
#include <iterator>

namespace pemaro {

namespace {

/// Writes the digits of `value` so that they end before `end`; returns their start.
template <typename Unsigned>
char* writeDigits(Unsigned value, char* end) {
    do {
        *--end = static_cast<char>('0' + static_cast<unsigned>(value % 10));
        value /= 10;
    } while (value != 0);
    return end;
}

std::string formatInteger(uint32_t magnitude, bool negative) {
    char buffer[11];
    char* const end = std::end(buffer);
    char* start = writeDigits(magnitude, end);
    if (negative) *--start = '-';
    return std::string(start, end);
}

constexpr unsigned kDecimals = 6;
constexpr uint64_t kDecimalScale = 1000000;

/// m * 10^6 / 2^shift, rounded half to even.
uint64_t scaledQuotient(uint64_t m, unsigned shift) {
    const uint64_t scaled = m * kDecimalScale;
    if (shift >= 64) return 0;
    const uint64_t quotient = scaled >> shift;
    const uint64_t remainder = scaled & ((uint64_t{1} << shift) - 1);
    const uint64_t half = uint64_t{1} << (shift - 1);
    const bool up = remainder > half || (remainder == half && (quotient & 1) != 0);
    return quotient + (up ? 1 : 0);
}

/// Splits a finite float into m * 2^e.
void splitFloat(uint32_t bits, uint32_t& m, int& e) {
    const uint32_t exponent = (bits >> 23) & 0xFF;
    const uint32_t fraction = bits & 0x7FFFFF;
    m = exponent == 0 ? fraction : fraction | 0x800000;
    e = (exponent == 0 ? 1 : static_cast<int>(exponent)) - 150;
}

bool isWhite(char c) {
    return c == ' ' || (c >= '\t' && c <= '\r');
}

bool isDigit(char c) {
    return c >= '0' && c <= '9';
}

/// Skips white space and a sign.
const char* skipToDigits(const char* text, bool& negative) {
    while (isWhite(*text)) ++text;
    negative = *text == '-';
    if (*text == '-' || *text == '+') ++text;
    return text;
}

/// As many digits as surely fit into 64 bits with a sign.
constexpr int kSafeDigits = 18;

enum class Scan { kFound, kNone, kUndecided };

Scan scanInteger(const char* text, int64_t& value) {
    bool negative = false;
    const char* const digits = skipToDigits(text, negative);
    const char* at = digits;
    int64_t magnitude = 0;
    for (; isDigit(*at); ++at) {
        if (at - digits == kSafeDigits) return Scan::kUndecided;
        magnitude = magnitude * 10 + (*at - '0');
    }
    if (at == digits) return Scan::kNone;
    value = negative ? -magnitude : magnitude;
    return Scan::kFound;
}

/// The powers of ten that kSafeDigits decimals need, all of them exact doubles.
constexpr double kPowersOfTen[kSafeDigits + 1] = {1e0,  1e1,  1e2,  1e3,  1e4,  1e5,  1e6,
                                                  1e7,  1e8,  1e9,  1e10, 1e11, 1e12, 1e13,
                                                  1e14, 1e15, 1e16, 1e17, 1e18};

/// A number's digits without the point, and how many of them stood behind it.
struct Decimal {
    uint64_t mantissa = 0;
    int digits = 0;
    int decimals = 0;
};

/// Reads `digits[.digits]`; false when there are more than kSafeDigits.
bool readDecimal(const char*& at, Decimal& decimal) {
    bool behindPoint = false;
    for (;; ++at) {
        if (*at == '.' && !behindPoint) {
            behindPoint = true;
        } else if (isDigit(*at)) {
            if (++decimal.digits > kSafeDigits) return false;
            decimal.mantissa = decimal.mantissa * 10 + static_cast<uint64_t>(*at - '0');
            decimal.decimals += behindPoint ? 1 : 0;
        } else {
            return true;
        }
    }
}

/// Whether rounding this double, which is 0 or within the range of a float's full precision, to float
/// gives the same as rounding the number that it stands for.
bool roundsOnce(double value) {
    constexpr uint64_t kBelowFloat = (uint64_t{1} << 29) - 1;
    constexpr uint64_t kHalfway = uint64_t{1} << 28;
    uint64_t bits = 0;
    memcpy(&bits, &value, sizeof(bits));
    return (bits & kBelowFloat) != kHalfway;
}

bool scanPlainFloat(const char* text, float& value) {
    bool negative = false;
    const char* at = skipToDigits(text, negative);
    Decimal decimal;
    if (!readDecimal(at, decimal) || decimal.digits == 0) return false;
    if (*at != '\0' && strchr("eExXpPiInN'", *at) != nullptr) return false;
    if (decimal.mantissa >> DBL_MANT_DIG != 0) return false;
    const double magnitude = static_cast<double>(decimal.mantissa) / kPowersOfTen[decimal.decimals];
    if (!roundsOnce(magnitude)) return false;
    const float rounded = static_cast<float>(magnitude);
    value = negative ? -rounded : rounded;
    return true;
}

/// What is left to sscanf. A process may have a locale whose decimal point is a comma; what peers
/// write has a point.
int scanAnyFloat(const char* text, float& value) {
    static const locale_t plain = newlocale(LC_NUMERIC_MASK, "C", nullptr);
    const locale_t own = uselocale(plain);
    const int count = sscanf(text, "%f", &value);
    uselocale(own);
    return count;
}

}  // namespace

std::string formatUnsigned(uint32_t value) {
    return formatInteger(value, false);
}

std::string formatSigned(int32_t value) {
    const uint32_t bits = static_cast<uint32_t>(value);
    return formatInteger(value < 0 ? 0 - bits : bits, value < 0);
}

std::string formatFloat(float value) {
    char buffer[51];
    if (!std::isfinite(value)) {
        const int length = snprintf(buffer, sizeof(buffer), "%f", static_cast<double>(value));
        return std::string(buffer, static_cast<size_t>(length));
    }
    uint32_t bits = 0;
    memcpy(&bits, &value, sizeof(bits));
    uint32_t m = 0;
    int e = 0;
    splitFloat(bits, m, e);

    const uint64_t scaled = e < 0 ? scaledQuotient(m, static_cast<unsigned>(-e)) : 0;
    char* const end = std::end(buffer);
    char* const point = end - kDecimals - 1;
    memset(point + 1, '0', kDecimals);
    writeDigits(scaled % kDecimalScale, end);
    *point = '.';
    char* start = e < 0 ? writeDigits(scaled / kDecimalScale, point)
                        : writeDigits(static_cast<unsigned __int128>(m) << e, point);
    if (std::signbit(value)) *--start = '-';
    return std::string(start, end);
}

bool scanUnsigned(const char* text, uint32_t& value) {
    int64_t wide = 0;
    switch (scanInteger(text, wide)) {
        case Scan::kFound:
            value = static_cast<uint32_t>(wide);
            return true;
        case Scan::kNone:
            return false;
        case Scan::kUndecided:
            break;
    }
    return sscanf(text, "%u", &value) == 1;
}

bool scanSigned(const char* text, int32_t& value) {
    int64_t wide = 0;
    switch (scanInteger(text, wide)) {
        case Scan::kFound:
            value = static_cast<int32_t>(wide);
            return true;
        case Scan::kNone:
            return false;
        case Scan::kUndecided:
            break;
    }
    return sscanf(text, "%d", &value) == 1;
}

bool scanFloat(const char* text, float& value) {
    return scanPlainFloat(text, value) || scanAnyFloat(text, value) == 1;
}

}  // namespace pemaro
