// SPDX-License-Identifier: Apache-2.0

// Numbers and texts beside what snprintf and sscanf make of them. ZELK_SEED repeats a run.

#include "values/NumberText.h"

#include <gtest/gtest.h>
#include <locale.h>
#include <unistd.h>

#include <cmath>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <iostream>
#include <limits>
#include <random>

#include "tests/support/Sanitizers.h"

namespace pemaro {
namespace {

constexpr int kRandomNumbers = test::kSanitized ? 30000 : 300000;

uint64_t seedOfTheRun() {
    const char* const value = getenv("ZELK_SEED");
    const uint64_t seed = value == nullptr ? std::random_device()() : strtoull(value, nullptr, 0);
    std::cout << "ZELK_SEED=" << seed << std::endl;
    return seed;
}

template <typename T>
std::string printed(const char* format, T value) {
    char buffer[64];
    snprintf(buffer, sizeof(buffer), format, value);
    return buffer;
}

float floatOf(uint32_t bits) {
    float value;
    memcpy(&value, &bits, sizeof(value));
    return value;
}

uint32_t bitsOf(float value) {
    uint32_t bits;
    memcpy(&bits, &value, sizeof(bits));
    return bits;
}

#ifdef __GLIBC__
// A locale with the decimal point of most of Europe, as localedef makes it, without its help.
class CommaLocale {
  public:
    CommaLocale() {
        static constexpr char kNumeric[] =
                "\x14\x11\x03\x20\x06\0\0\0\x20\0\0\0\x22\0\0\0\x23\0\0\0\x24\0\0\0"
                "\x28\0\0\0\x2c\0\0\0,\0\0\0,\0\0\0\0\0\0\0ANSI_X3.4-1968";
        namespace fs = std::filesystem;
        const fs::path folder = testing::TempDir() + "NumberText_test." + std::to_string(getpid());
        fs::create_directories(folder / "comma");
        std::ofstream(folder / "comma" / "LC_NUMERIC").write(kNumeric, sizeof(kNumeric));
        setenv("LOCPATH", folder.c_str(), 1);
        EXPECT_NE(nullptr, setlocale(LC_NUMERIC, "comma"));
        unsetenv("LOCPATH");
        fs::remove_all(folder);
    }
    ~CommaLocale() { setlocale(LC_NUMERIC, "C"); }
};

// What peers send does not depend on where the user is, however many digits it has.
TEST(NumberText, ReadsAPointInEveryLocale) {
    const CommaLocale comma;
    ASSERT_EQ(1.5f, strtof("1,5", nullptr));
    for (const char* text : {"1.5", "0.15e1", "1.50000000000000000000000000", "0x1.8p0"}) {
        float value = 0;
        EXPECT_TRUE(scanFloat(text, value));
        EXPECT_EQ(1.5f, value) << text;
    }
    EXPECT_EQ("1.500000", formatFloat(1.5f));
    EXPECT_EQ(1.5f, strtof("1,5", nullptr)) << "the process keeps its locale";
}
#endif

TEST(NumberText, FormatsIntegersAsPrintfDoes) {
    std::mt19937_64 random(seedOfTheRun());
    const auto check = [](uint32_t bits) {
        ASSERT_EQ(formatUnsigned(bits), printed("%u", bits));
        const int32_t asSigned = static_cast<int32_t>(bits);
        ASSERT_EQ(formatSigned(asSigned), printed("%d", asSigned));
    };
    for (const uint32_t bits : {0u, 1u, 9u, 10u, 0x7FFFFFFFu, 0x80000000u, 0xFFFFFFFFu})
        check(bits);
    for (int i = 0; i < kRandomNumbers; ++i) {
        check(static_cast<uint32_t>(random()) >> (random() % 32));
    }
}

TEST(NumberText, FormatsFloatsAsPrintfDoes) {
    std::mt19937_64 random(seedOfTheRun());
    const auto check = [](float value) {
        ASSERT_EQ(formatFloat(value), printed("%f", static_cast<double>(value))) << bitsOf(value);
    };
    using Limits = std::numeric_limits<float>;
    for (const float value : {0.0f,
                              1.0f,
                              0.5f,
                              1.5f,
                              0.1f,
                              1e-6f,
                              5e-7f,
                              9.9999995f,
                              0.9999999f,
                              16777216.0f,
                              8388608.5f,
                              0.0000005f,
                              1.0f / 64,
                              3.0f / 128,
                              0.00000047683716f,
                              Limits::max(),
                              Limits::min(),
                              Limits::denorm_min(),
                              Limits::infinity(),
                              Limits::quiet_NaN()}) {
        check(value);
        check(-value);
    }
    // Every exponent, with the fractions at its ends.
    for (uint32_t exponent = 0; exponent < 256; ++exponent) {
        for (const uint32_t fraction : {0u, 1u, 0x400000u, 0x7FFFFFu}) {
            check(floatOf(exponent << 23 | fraction));
        }
    }
    // Exact halves of the last decimal: k / 2^7 has seven decimals, the last one a 5.
    for (int k = -2000; k < 2000; ++k) check(static_cast<float>(k) / 128);
    for (int i = 0; i < kRandomNumbers; ++i) check(floatOf(static_cast<uint32_t>(random())));
    // Numbers as they occur, of moderate size.
    std::uniform_real_distribution<float> moderate(-1000.0f, 1000.0f);
    for (int i = 0; i < kRandomNumbers; ++i) check(moderate(random));
}

/// Scans `text` both ways and expects the same: whether a number was found, and which.
template <typename T>
void expectScanned(bool (*scan)(const char*, T&), const char* format, const std::string& text,
                   T untouched) {
    T expected = untouched;
    const bool found = sscanf(text.c_str(), format, &expected) == 1;
    T actual = untouched;
    ASSERT_EQ(scan(text.c_str(), actual), found) << format << " of '" << text << "'";
    // Bit by bit: a NaN and the sign of a zero count too.
    ASSERT_EQ(memcmp(&actual, &expected, sizeof(T)), 0) << format << " of '" << text << "'";
}

void expectScanned(const std::string& text) {
    expectScanned<uint32_t>(scanUnsigned, "%u", text, 99);
    expectScanned<int32_t>(scanSigned, "%d", text, 99);
    expectScanned<float>(scanFloat, "%f", text, 99.0f);
    // The 16-bit conversions are the low half of the others.
    unsigned short expected = 99;
    uint32_t actual = 99;
    const bool found = sscanf(text.c_str(), "%hu", &expected) == 1;
    ASSERT_EQ(scanUnsigned(text.c_str(), actual), found) << text;
    ASSERT_EQ(static_cast<unsigned short>(actual), expected) << text;
    short expectedSigned = 99;
    int32_t actualSigned = 99;
    const bool foundSigned = sscanf(text.c_str(), "%hd", &expectedSigned) == 1;
    ASSERT_EQ(scanSigned(text.c_str(), actualSigned), foundSigned) << text;
    ASSERT_EQ(static_cast<short>(actualSigned), expectedSigned) << text;
}

TEST(NumberText, ScansOddTextsAsScanfDoes) {
    for (const char* text : {"",
                             " ",
                             "-",
                             "+",
                             "--1",
                             "+-1",
                             ".",
                             "-.",
                             "1.",
                             ".5",
                             "-.5",
                             "1..2",
                             "1.5.2",
                             "0x10",
                             "0x",
                             "0x1p4",
                             "0X1P-2x",
                             "1e5",
                             "1e",
                             "1e+",
                             "1e400",
                             "-1e-400",
                             "inf",
                             "-INFINITY",
                             "infin",
                             "nan",
                             "NaN(12)",
                             "1n",
                             "1i",
                             "1'000",
                             "1,5",
                             " \t\r\n\v\f 12",
                             "\b1",
                             "\xa0"
                             "1",
                             "2147483647",
                             "2147483648",
                             "4294967295",
                             "4294967296",
                             "-4294967297",
                             "999999999999999999",
                             "9223372036854775807",
                             "9223372036854775808",
                             "-9223372036854775808",
                             "-9223372036854775809",
                             "18446744073709551615",
                             "18446744073709551616",
                             "0000000000000000000000000012",
                             "1.0000000596046448",
                             "1.00000005960464477539",
                             "16777217",
                             "16777217.0000001",
                             "3.4028235e38",
                             "340282346638528859811704183484516925440",
                             "340282356779733661637539395458142568448",
                             "0.000000000000001",
                             "0.0000000000000000001",
                             "9007199254740993",
                             "9007199254740992.5",
                             "-0",
                             "-0.0",
                             "0."}) {
        expectScanned(text);
    }
}

TEST(NumberText, ScansRandomTextsAsScanfDoes) {
    std::mt19937_64 random(seedOfTheRun());
    static constexpr char kAlphabet[] = "0123456789012345678900..-+ eExpinf";
    std::string text;
    for (int i = 0; i < kRandomNumbers; ++i) {
        text.clear();
        for (size_t length = random() % 24; length != 0; --length) {
            text += kAlphabet[random() % (sizeof(kAlphabet) - 1)];
        }
        ASSERT_NO_FATAL_FAILURE(expectScanned(text));
    }
    for (int i = 0; i < kRandomNumbers; ++i) {
        const float value = floatOf(static_cast<uint32_t>(random()));
        ASSERT_NO_FATAL_FAILURE(expectScanned(printed("%f", static_cast<double>(value))));
        // Next to halfway between two floats, where rounding twice would show: the double that is
        // nearest to these sixteen digits often lies exactly there, though the number does not.
        const float low = std::ldexp(1.0f + static_cast<float>(random() % 8388608) / 8388608,
                                     static_cast<int>(random() % 3));
        const double halfway = (static_cast<double>(low) + std::nextafterf(low, 9.0f)) / 2;
        ASSERT_NO_FATAL_FAILURE(expectScanned(printed("%.15f", halfway)));
    }
}

}  // namespace
}  // namespace pemaro
