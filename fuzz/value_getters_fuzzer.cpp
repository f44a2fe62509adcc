// SPDX-License-Identifier: Apache-2.0

// Gives a value any text and tag and compares what its getters make of it with the C library's scanf, which
// they promise to agree with.

#include <fuzzer/FuzzedDataProvider.h>
#include <strings.h>

#include <cstdint>
#include <cstdio>
#include <cstring>
#include <string>

#include "fuzz/support/ParcelInput.h"
#include "pemaro/SerializableBlob.h"
#include "pemaro/SerializableMap.h"
#include "pemaro/SerializableMapArray.h"
#include "pemaro/Status.h"
#include "pemaro/TextReader.h"

namespace {

using namespace pemaro;

bool isContainer(int tag) {
    return tag == VALUE_TYPE_NULL || (tag >= VALUE_TYPE_OBJECT && tag <= VALUE_TYPE_BLOB);
}

// The bytes are compared, for a NaN is no NaN's equal.
template <typename Number>
void check(const SerializableValue& value, const std::string& text, int tag, const char* format,
           const char* what) {
    Number expected = static_cast<Number>(77);
    Number actual = expected;
    const bool readable = !isContainer(tag) && sscanf(text.c_str(), format, &expected) == 1;
    const int status = value.getValue(actual);
    fuzz::expect(status == (readable ? STATUS_NO_ERROR : STATUS_INVALID_FORMAT), what);
    if (!readable) expected = static_cast<Number>(77);
    fuzz::expect(memcmp(&expected, &actual, sizeof(expected)) == 0, what);
}

void checkBool(const SerializableValue& value, const std::string& text, int tag) {
    const bool isFalse = strncasecmp(text.c_str(), "false", 5) == 0;
    const bool isTrue = strncasecmp(text.c_str(), "true", 4) == 0;
    for (const bool before : {false, true}) {
        bool actual = before;
        const bool readable = !isContainer(tag) && (isFalse || isTrue);
        fuzz::expect(value.getValue(actual) == (readable ? STATUS_NO_ERROR : STATUS_INVALID_FORMAT),
                     "bool");
        fuzz::expect(actual == (readable ? isTrue : before), "bool");
    }
}

void checkContainers(const SerializableValue& value, int tag) {
    SerializableMap map;
    SerializableMapArray array;
    SerializableBlob blob;
    fuzz::expect((value.getValue(map) == STATUS_NO_ERROR) == (tag == VALUE_TYPE_OBJECT), "map");
    fuzz::expect((value.getValue(array) == STATUS_NO_ERROR) == (tag == VALUE_TYPE_ARRAY), "array");
    fuzz::expect((value.getValue(blob) == STATUS_NO_ERROR) == (tag == VALUE_TYPE_BLOB), "blob");
}

void checkText(const SerializableValue& value, const std::string& text, int tag) {
    std::string actual = "before";
    const int status = value.getValue(actual);
    fuzz::expect(status == (isContainer(tag) ? STATUS_INVALID_FORMAT : STATUS_NO_ERROR), "text");
    fuzz::expect(actual == (isContainer(tag) ? "before" : text), "text");
    SerializableValue copy(value);
    std::string copied;
    fuzz::expect(copy.getValue(copied) == status && (status != 0 || copied == text), "copied text");
}

void checkPieces(const std::string& text) {
    constexpr char kSpace[] = " \t\r\n\v\f";
    std::string trimmed = text;
    removeWhitesSpaces(trimmed);
    const size_t first = text.find_first_not_of(kSpace);
    const std::string expected =
            first == std::string::npos
                    ? text
                    : text.substr(first, text.find_last_not_of(kSpace) - first + 1);
    fuzz::expect(trimmed == expected, "removeWhitesSpaces");
    if (!trimmed.empty()) findValueType(trimmed);

    char* colon = nullptr;
    std::string key = "before";
    const int status = findKey(text.c_str(), &colon, key);
    const char* end = text.c_str() + strlen(text.c_str());
    fuzz::expect(status == 0 ? colon > text.c_str() && colon < end && *colon == ':'
                             : colon == nullptr && key == "before",
                 "findKey");
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    if (size == 0) return -1;
    const int tag = data[0] % 18;
    const std::string text(reinterpret_cast<const char*>(data) + 1, size - 1);
    const SerializableValue value(text, tag);
    check<unsigned char>(value, text, tag, "%hhu", "unsigned char");
    check<signed char>(value, text, tag, "%hhd", "signed char");
    check<unsigned short>(value, text, tag, "%hu", "unsigned short");
    check<short>(value, text, tag, "%hd", "short");
    check<unsigned int>(value, text, tag, "%u", "unsigned int");
    check<int>(value, text, tag, "%d", "int");
    check<float>(value, text, tag, "%f", "float");
    checkBool(value, text, tag);
    checkText(value, text, tag);
    checkContainers(value, tag);
    checkPieces(text);
    return 0;
}
