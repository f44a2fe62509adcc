// SPDX-License-Identifier: Apache-2.0

// The reader and the writer beside a slow and obvious transcription of the same rules. ZELK_SEED
// repeats a run, ZELK_RANDOM_TEXTS sets how many random texts it has.

#include <gtest/gtest.h>

#include <cstdlib>
#include <iostream>
#include <random>
#include <string_view>

#include "pemaro/SerializableMap.h"
#include "pemaro/SerializableMapArray.h"
#include "tests/support/Sanitizers.h"
#include "tests/values/reference/Comparison.h"

namespace pemaro {
namespace {

using reference::As;
using reference::Comparison;

constexpr unsigned long kDefaultTexts = test::kSanitized ? 50000 : 1000000;

unsigned long setting(const char* name, unsigned long otherwise) {
    const char* const value = getenv(name);
    return value == nullptr ? otherwise : strtoul(value, nullptr, 0);
}

/// Makes texts that a reader may meet: well-formed ones, the same with a few characters changed,
/// and heaps of the characters and words that mean something to it.
class TextMaker {
  public:
    explicit TextMaker(uint64_t seed) : mRandom(seed) {}

    std::string make(As as) {
        mText.clear();
        const unsigned kind = below(4);
        if (kind == 3) {
            const bool bracketed = below(4) != 0;
            if (bracketed) mText += as == As::kMap ? "{\"k\":" : "[";
            appendHeap();
            if (bracketed) mText += as == As::kMap ? '}' : ']';
        } else {
            appendContainer(as == As::kMap, 0);
            if (kind == 2) mutate();
        }
        return mText;
    }

  private:
    unsigned below(unsigned n) { return static_cast<unsigned>(mRandom() % n); }

    void appendSpace() {
        while (below(8) == 0) mText += " \t\r\n\v\f"[below(6)];
    }

    void appendWord() {
        static constexpr std::string_view kWords[] = {
                "1",     "-3",      "1.250000",   ".5",    "true",  "false", "null", "blob",
                "\"x\"", "\"a,b\"", "\"q\\\"q\"", "\"{\"", "\"]\"", "a b",   "\"\"", "-"};
        mText += kWords[below(std::size(kWords))];
    }

    void appendKey() {
        static constexpr std::string_view kKeys[] = {"a",   "b",    "ab", "c:d",
                                                     "e,f", "\\\"", "k}", "B"};
        mText += '"';
        mText += kKeys[below(std::size(kKeys))];
        mText += "\"";
        appendSpace();
        mText += ':';
    }

    void appendContainer(bool isMap, unsigned depth) {
        appendSpace();
        mText += isMap ? '{' : '[';
        const unsigned size = below(5);
        for (unsigned i = 0; i < size; ++i) {
            if (i != 0) mText += ',';
            appendSpace();
            if (isMap) appendKey();
            appendSpace();
            if (depth < 4 && below(3) == 0) {
                appendContainer(below(2) == 0, depth + 1);
            } else {
                appendWord();
                appendSpace();
            }
        }
        mText += isMap ? '}' : ']';
    }

    char oddCharacter() {
        static constexpr char kOdd[] = "{}[]\"\",,::\\\\ -.a1\t";
        // One of them in 200 is the NUL that ends a text early.
        return below(200) == 0 ? '\0' : kOdd[below(sizeof(kOdd) - 1)];
    }

    void mutate() {
        for (unsigned edits = 1 + below(4); edits != 0 && !mText.empty(); --edits) {
            const size_t at = below(static_cast<unsigned>(mText.size()));
            switch (below(3)) {
                case 0:
                    mText.erase(at, 1 + below(3));
                    break;
                case 1:
                    mText.insert(at, 1, oddCharacter());
                    break;
                default:
                    mText[at] = oddCharacter();
            }
        }
    }

    void appendHeap() {
        for (unsigned pieces = below(24); pieces != 0; --pieces) {
            switch (below(6)) {
                case 0:
                    appendKey();
                    break;
                case 1:
                    appendWord();
                    break;
                default:
                    mText += oddCharacter();
            }
        }
    }

    std::mt19937_64 mRandom;
    std::string mText;
};

std::string shown(const std::string& text) {
    return testing::PrintToString(text);
}

TEST(ReaderComparison, RandomTextsAreReadAsTheReferenceReadsThem) {
    const unsigned long seed = setting("ZELK_SEED", std::random_device()());
    const unsigned long count = setting("ZELK_RANDOM_TEXTS", kDefaultTexts);
    std::cout << "ZELK_SEED=" << seed << " ZELK_RANDOM_TEXTS=" << count << std::endl;
    TextMaker maker(seed);
    unsigned long accepted = 0;
    unsigned long aborting = 0;
    unsigned long endedInSpace = 0;
    std::vector<std::pair<std::string, As>> abortingSample;
    for (unsigned long i = 0; i < count; ++i) {
        const As as = i % 2 == 0 ? As::kMap : As::kArray;
        const std::string text = maker.make(as);
        const Comparison comparison = reference::compare(text, as);
        ASSERT_EQ(comparison.difference, "") << shown(text);
        accepted += comparison.accepted ? 1 : 0;
        endedInSpace += comparison.endedInSpace ? 1 : 0;
        if (!comparison.aborts) continue;
        ++aborting;
        if (abortingSample.size() < 20) abortingSample.emplace_back(text, as);
    }
    for (const auto& [text, as] : abortingSample) {
        SCOPED_TRACE(shown(text));
        const auto read = [&text = text, as = as] {
            if (as == As::kMap) {
                SerializableMap().unserialize(text);
            } else {
                SerializableMapArray().unserialize(text);
            }
        };
        EXPECT_DEATH(read(), "token.empty\\(\\)\\|SerializableMap\\|");
    }
    std::cout << accepted << " read, " << count - accepted - aborting << " refused, " << aborting
              << " fatal (" << abortingSample.size() << " of them run)" << std::endl;
    // The outermost bracket stops every search for something else than white space before the text
    // ends, so the library does without that failure.
    EXPECT_EQ(endedInSpace, 0u);
    // The texts are worth something only while each outcome is well represented.
    EXPECT_GT(accepted, count / 10);
    EXPECT_GT(count - accepted - aborting, count / 10);
}

/// Calls `use` with every text of `length` characters out of `alphabet`.
template <typename Use>
void forEachText(std::string_view alphabet, size_t length, Use use) {
    std::string text(length, alphabet.front());
    std::vector<size_t> digits(length, 0);
    for (;;) {
        use(text);
        size_t at = 0;
        while (at < length && ++digits[at] == alphabet.size()) {
            digits[at] = 0;
            text[at++] = alphabet.front();
        }
        if (at == length) return;
        text[at] = alphabet[digits[at]];
    }
}

TEST(ReaderComparison, AllShortTextsAreReadAsTheReferenceReadsThem) {
    constexpr size_t kLongest =
#ifdef ZELK_SANITIZED
            3;
#else
            5;
#endif
    for (size_t length = 0; length <= kLongest; ++length) {
        forEachText("{}[]\",:\\a ", length, [](const std::string& inner) {
            for (const As as : {As::kMap, As::kArray}) {
                const std::string text =
                        as == As::kMap ? "{\"k\":" + inner + "}" : "[" + inner + "]";
                const Comparison comparison = reference::compare(text, as);
                ASSERT_EQ(comparison.difference, "") << shown(text);
                ASSERT_FALSE(comparison.endedInSpace) << shown(text);
            }
        });
        if (HasFatalFailure()) return;
    }
}

}  // namespace
}  // namespace pemaro
