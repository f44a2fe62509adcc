// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string_view>

#include "values/ValueAccess.h"

namespace pemaro {

/// What was read of a text and waits for its container to be complete: a key, a scalar's text with
/// its tag, or a map or array, whose owner is whoever holds the item. Texts are views into what is
/// read.
class ReadItem {
  public:
    ReadItem() = default;
    ReadItem(std::string_view text, int type)
            : mText(text.data()), mLengthAndType(text.size() << 8 | static_cast<size_t>(type)) {}
    explicit ReadItem(SerializableMap* map) : mMap(map), mLengthAndType(VALUE_TYPE_OBJECT) {}
    explicit ReadItem(SerializableMapArray* array)
            : mArray(array), mLengthAndType(VALUE_TYPE_ARRAY) {}

    /// Of a key or a scalar.
    std::string_view text() const { return {mText, mLengthAndType >> 8}; }

    /// Where in memory what it stands for is.
    const void* address() const { return mText; }

    /// What it stands for, as a value. That of a container owns it.
    SerializableValue value() const {
        switch (type()) {
            case VALUE_TYPE_OBJECT:
                return ValueAccess::make(VALUE_TYPE_OBJECT, mMap, nullptr, nullptr);
            case VALUE_TYPE_ARRAY:
                return ValueAccess::make(VALUE_TYPE_ARRAY, nullptr, mArray, nullptr);
            case VALUE_TYPE_NULL:
                return ValueAccess::make(VALUE_TYPE_NULL, nullptr, nullptr, nullptr);
            default:
                return ValueAccess::make(type(), [&] { return std::string(text()); });
        }
    }

    void destroyContainer() const {
        if (type() == VALUE_TYPE_OBJECT) delete mMap;
        if (type() == VALUE_TYPE_ARRAY) delete mArray;
    }

  private:
    unsigned type() const { return mLengthAndType & 0xff; }

    union {
        const char* mText;
        SerializableMap* mMap;
        SerializableMapArray* mArray;
    };
    size_t mLengthAndType;
};

/// A key and its value, which follow each other.
struct ReadEntry {
    ReadItem key;
    ReadItem value;
};

/// So many do not stay in the cache.
constexpr size_t kManyEntries = 4096;

}  // namespace pemaro
