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

#include <vector>

#include "values/ValueAccess.h"

namespace pemaro {

namespace {

using A = ValueAccess;

/// A container that is being written: one of the two pointers is set.
struct Level {
    const SerializableMap* map;
    const SerializableMapArray* array;
    size_t size;
    size_t next;

    explicit Level(const SerializableMap* m)
            : map(m), array(nullptr), size(m == nullptr ? 0 : A::size(*m)), next(0) {}
    explicit Level(const SerializableMapArray* a)
            : map(nullptr), array(a), size(a == nullptr ? 0 : A::size(*a)), next(0) {}
};

class TextWriter {
  public:
    std::string write(Level level, bool isMap);

  private:
    void open(Level level, bool isMap);
    void writeNext();
    void writeValue(const SerializableValue& value);

    struct OpenLevel {
        Level level;
        char close;
    };
    std::vector<OpenLevel> mOpen;
    std::string mText;
};

std::string TextWriter::write(Level level, bool isMap) {
    open(level, isMap);
    while (!mOpen.empty()) {
        if (mOpen.back().level.next < mOpen.back().level.size) {
            writeNext();
        } else {
            mText += mOpen.back().close;
            mOpen.pop_back();
        }
    }
    return std::move(mText);
}

void TextWriter::open(Level level, bool isMap) {
    mText += isMap ? '{' : '[';
    mOpen.push_back({level, isMap ? '}' : ']'});
}

void TextWriter::writeNext() {
    Level& level = mOpen.back().level;
    const size_t index = level.next++;
    if (index != 0) mText += ',';
    if (level.map == nullptr) {
        writeValue(A::at(*level.array, index));
        return;
    }
    mText += '"';
    mText += A::entries(*level.map).keyAt(index);
    mText += "\":";
    writeValue(A::at(*level.map, index));
}

void TextWriter::writeValue(const SerializableValue& value) {
    switch (A::type(value)) {
        case VALUE_TYPE_NULL:
            break;
        case VALUE_TYPE_STRING:
            mText += '"';
            mText += A::text(value);
            mText += '"';
            break;
        case VALUE_TYPE_OBJECT:
            open(Level(A::map(value)), true);
            break;
        case VALUE_TYPE_ARRAY:
            open(Level(A::array(value)), false);
            break;
        case VALUE_TYPE_BLOB:
            mText += "blob";
            break;
        default:
            mText += A::text(value);
    }
}

}  // namespace

std::string writeText(const SerializableMap& map) {
    return TextWriter().write(Level(&map), true);
}

std::string writeText(const SerializableMapArray& array) {
    return TextWriter().write(Level(&array), false);
}

}  // namespace pemaro
