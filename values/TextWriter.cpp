// SPDX-License-Identifier: Apache-2.0

// The text form. Nothing is written between its tokens.
//
//     map    = "{" [ entry { "," entry } ] "}"        entries in ascending order of their keys
//     entry  = <"> key <"> ":" value
//     array  = "[" [ value { "," value } ] "]"
//     value  = <"> text <">       of a string
//            | map | array        of a value that holds one
//            | "blob"             of a blob, whose bytes are not written
//            | nothing            of the null value
//            | text               of every other tag
//
// Keys and texts are written as they are, without escapes.

#define LOG_TAG "SerializableMap"

#include "values/TextWriter.h"

#include <algorithm>
#include <cstring>

#include "values/ValueAccess.h"
#include "values/VectorStorage.h"
#include "values/WorkStack.h"

namespace pemaro {

namespace {

using A = ValueAccess;

class TextWriter {
  public:
    std::string write(const SerializableMap* map, const SerializableMapArray* array);

  private:
    /// A container that is being written: one of the two pointers is set.
    struct Level {
        const SerializableMap* map;
        const SerializableMapArray* array;
        size_t next;
    };

    bool writeEntries(Level& level);
    bool writeElements(Level& level);
    bool writeOrOpen(const SerializableValue& value);
    void open(const SerializableMap* map, const SerializableMapArray* array, char bracket);

    /// Makes room for `size` bytes and what may stand around them.
    void ensure(size_t size) {
        if (static_cast<size_t>(mLimit - mAt) < size + kPunctuation) grow(size + kPunctuation);
    }
    void grow(size_t size);
    void put(char c) { *mAt++ = c; }
    void put(const std::string& text) {
        memcpy(mAt, text.data(), text.size());
        mAt += text.size();
    }

    static constexpr size_t kPunctuation = 16;
    static constexpr size_t kFirstRoom = 240;

    WorkStack<Level, 16> mOpen;
    std::string mText;
    char* mAt = nullptr;
    char* mLimit = nullptr;
};

std::string TextWriter::write(const SerializableMap* map, const SerializableMapArray* array) {
    ensure(0);
    open(map, array, map != nullptr ? '{' : '[');
    while (!mOpen.empty()) {
        Level& level = mOpen.top();
        const bool isMap = level.map != nullptr;
        if (isMap ? writeEntries(level) : writeElements(level)) {
            ensure(0);
            put(isMap ? '}' : ']');
            mOpen.pop();
        }
    }
    mText.resize(static_cast<size_t>(mAt - mText.data()));
    return std::move(mText);
}

void TextWriter::open(const SerializableMap* map, const SerializableMapArray* array, char bracket) {
    put(bracket);
    mOpen.push({map, array, 0});
}

/// Writes what is left of a map, up to its end (then true) or to a container that is opened.
bool TextWriter::writeEntries(Level& level) {
    const EntryView entries = viewOf(*level.map);
    const size_t count = A::size(*level.map);
    for (size_t i = level.next; i < count; ++i) {
        const std::string& key = entries.key(i);
        const SerializableValue& value = entries.value(i);
        ensure(key.size() + A::text(value).size());
        if (i != 0) put(',');
        put('"');
        put(key);
        put('"');
        put(':');
        level.next = i + 1;
        if (writeOrOpen(value)) return false;
    }
    return true;
}

bool TextWriter::writeElements(Level& level) {
    const ElementView elements = viewOf(*level.array);
    const size_t count = A::size(*level.array);
    for (size_t i = level.next; i < count; ++i) {
        const SerializableValue& value = elements.value(i);
        ensure(A::text(value).size());
        if (i != 0) put(',');
        level.next = i + 1;
        if (writeOrOpen(value)) return false;
    }
    return true;
}

/// Writes a value, in the room ensured for it. True when it is a container that is only opened.
bool TextWriter::writeOrOpen(const SerializableValue& value) {
    switch (A::type(value)) {
        case VALUE_TYPE_NULL:
            return false;
        case VALUE_TYPE_STRING:
            put('"');
            put(A::text(value));
            put('"');
            return false;
        case VALUE_TYPE_OBJECT:
            if (A::map(value) != nullptr) {
                open(A::map(value), nullptr, '{');
                return true;
            }
            put('{');
            put('}');
            return false;
        case VALUE_TYPE_ARRAY:
            if (A::array(value) != nullptr) {
                open(nullptr, A::array(value), '[');
                return true;
            }
            put('[');
            put(']');
            return false;
        case VALUE_TYPE_BLOB:
            for (const char c : {'b', 'l', 'o', 'b'}) put(c);
            return false;
        default:
            put(A::text(value));
            return false;
    }
}

void TextWriter::grow(size_t size) {
    const size_t used = mAt == nullptr ? 0 : static_cast<size_t>(mAt - mText.data());
    mText.resize(std::max(kFirstRoom, 2 * used + size));
    mAt = mText.data() + used;
    mLimit = mText.data() + mText.size();
}

}  // namespace

std::string writeText(const SerializableMap& map) {
    return TextWriter().write(&map, nullptr);
}

std::string writeText(const SerializableMapArray& array) {
    return TextWriter().write(nullptr, &array);
}

}  // namespace pemaro
