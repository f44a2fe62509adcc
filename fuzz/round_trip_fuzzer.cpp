// SPDX-License-Identifier: Apache-2.0

// Makes a map or an array of values of every kind, writes it, reads that and writes it again. What is written
// has to be the reference's text, what is read the reference's tree, and what was read once does not change
// any more.

#include <fuzzer/FuzzedDataProvider.h>

#include <cstdint>
#include <cstring>
#include <string>

#include "fuzz/support/ParcelInput.h"
#include "pemaro/SerializableBlob.h"
#include "pemaro/SerializableMap.h"
#include "pemaro/SerializableMapArray.h"
#include "tests/values/reference/Comparison.h"
#include "tests/values/reference/ReferenceTree.h"

namespace {

using namespace pemaro;

constexpr size_t kLongestText = 24;
constexpr int kDeepest = 6;
constexpr size_t kLongestWritten = 4096;  // the reference takes quadratic time

SerializableValue makeValue(FuzzedDataProvider& input, int depth);

SerializableMap makeMap(FuzzedDataProvider& input, int depth) {
    SerializableMap map;
    for (int left = input.ConsumeIntegralInRange(0, 5); left > 0; --left) {
        const std::string key = input.ConsumeRandomLengthString(kLongestText);
        map.add(key, makeValue(input, depth + 1));
    }
    return map;
}

SerializableMapArray makeArray(FuzzedDataProvider& input, int depth) {
    SerializableMapArray array;
    for (int left = input.ConsumeIntegralInRange(0, 5); left > 0; --left) {
        array.add(makeValue(input, depth + 1));
    }
    return array;
}

SerializableValue makeValue(FuzzedDataProvider& input, int depth) {
    switch (input.ConsumeIntegralInRange(0, depth < kDeepest ? 13 : 11)) {
        case 0:
            return SerializableValue();
        case 1:
            return SerializableValue(input.ConsumeIntegral<unsigned char>());
        case 2:
            return SerializableValue(input.ConsumeIntegral<signed char>());
        case 3:
            return SerializableValue(input.ConsumeIntegral<unsigned short>());
        case 4:
            return SerializableValue(input.ConsumeIntegral<short>());
        case 5:
            return SerializableValue(input.ConsumeIntegral<unsigned int>());
        case 6:
            return SerializableValue(input.ConsumeIntegral<int>());
        case 7: {
            const auto bits = input.ConsumeIntegral<uint32_t>();
            float number;
            memcpy(&number, &bits, sizeof(number));
            return SerializableValue(number);
        }
        case 8:
            return SerializableValue(input.ConsumeBool());
        case 9:
            return SerializableValue(input.ConsumeRandomLengthString(kLongestText));
        case 10: {
            const std::string text = input.ConsumeRandomLengthString(kLongestText);
            return SerializableValue(text, input.ConsumeIntegralInRange(0, 17));
        }
        case 11: {
            const std::string bytes = input.ConsumeRandomLengthString(kLongestText);
            return SerializableValue(SerializableBlob(bytes.data(), bytes.size()));
        }
        case 12:
            return SerializableValue(makeMap(input, depth));
        default:
            return SerializableValue(makeArray(input, depth));
    }
}

template <typename Container>
void check(Container made, reference::As as) {
    const std::string text = made.serialize();
    fuzz::expect(text == reference::writeTree(reference::treeOf(made)), "not the reference's text");
    Container copy(made);
    fuzz::expect(copy.serialize() == text, "a copy writes another text");
    if (text.size() > kLongestWritten) return;
    const reference::Comparison comparison = reference::compare(text, as);
    fuzz::expect(comparison.difference.empty(), comparison.difference.c_str());
    if (comparison.aborts || !comparison.accepted) return;

    Container read;
    fuzz::expect(read.unserialize(text) == 0, "not read a second time");
    const std::string again = read.serialize();
    // A quote inside a text, or a text without one, may be split otherwise each time: only what is read and
    // written without a change is stable.
    if (again != text) return;
    Container third;
    fuzz::expect(third.unserialize(again) == 0 && third.serialize() == again, "not stable");
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    FuzzedDataProvider input(data, size);
    if (input.ConsumeBool()) {
        check(makeMap(input, 0), reference::As::kMap);
    } else {
        check(makeArray(input, 0), reference::As::kArray);
    }
    return 0;
}
