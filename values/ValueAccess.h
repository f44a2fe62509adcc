// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstddef>
#include <string>
#include <utility>

#include "pemaro/SerializableBlob.h"
#include "pemaro/SerializableMap.h"
#include "pemaro/SerializableMapArray.h"
#include "pemaro/SerializableValue.h"

namespace pemaro {

/// The library's own way into the value classes: the tree of a value as it is held, without the
/// copies and checks of the public operations. A value tagged as a container may hold none (a null
/// pointer, when it was made of a text and a tag): it counts as an empty one.
struct ValueAccess {
    struct Layout;

    using DefaultEntries = android::DefaultKeyedVector<std::string, SerializableValue>;
    using Entries = android::KeyedVector<std::string, SerializableValue>;
    using Elements = android::Vector<SerializableValue>;

    static uint32_t& type(SerializableValue& v) { return v.mType; }
    static SerializableMap*& map(SerializableValue& v) { return v.mMap; }
    static SerializableMapArray*& array(SerializableValue& v) { return v.mArray; }
    static SerializableBlob*& blob(SerializableValue& v) { return v.mBlob; }
    static std::string& text(SerializableValue& v) { return v.mValue; }

    static uint32_t type(const SerializableValue& v) { return v.mType; }
    static const SerializableMap* map(const SerializableValue& v) { return v.mMap; }
    static const SerializableMapArray* array(const SerializableValue& v) { return v.mArray; }
    static const SerializableBlob* blob(const SerializableValue& v) { return v.mBlob; }
    static const std::string& text(const SerializableValue& v) { return v.mValue; }

    static bool hasContainerTag(const SerializableValue& v) {
        return v.mType == VALUE_TYPE_NULL || v.mType == VALUE_TYPE_OBJECT ||
               v.mType == VALUE_TYPE_ARRAY || v.mType == VALUE_TYPE_BLOB;
    }

    static Entries& entries(SerializableMap& m) { return m; }
    static const Entries& entries(const SerializableMap& m) { return m; }
    static Elements& elements(SerializableMapArray& a) { return a.mElements; }
    static const Elements& elements(const SerializableMapArray& a) { return a.mElements; }

    /// Values made in place: of a container, which becomes theirs and may be null, and of the text
    /// that `makeText` returns.
    static SerializableValue make(uint32_t type, SerializableMap* map, SerializableMapArray* array,
                                  SerializableBlob* blob) {
        return SerializableValue(type, map, array, blob, [] { return std::string(); });
    }
    template <typename MakeText>
    static SerializableValue make(uint32_t type, MakeText makeText) {
        return SerializableValue(type, nullptr, nullptr, nullptr, makeText);
    }
    /// What `v` is, leaving a null value.
    static SerializableValue take(SerializableValue& v) {
        const uint32_t type = std::exchange(v.mType, VALUE_TYPE_NULL);
        return SerializableValue(type, std::exchange(v.mMap, nullptr),
                                 std::exchange(v.mArray, nullptr), std::exchange(v.mBlob, nullptr),
                                 [&] { return std::move(v.mValue); });
    }

    static size_t size(const SerializableMap& m) { return entries(m).size(); }
    static size_t size(const SerializableMapArray& a) { return a.mElements.size(); }
};

template <typename MakeText>
inline SerializableValue::SerializableValue(uint32_t type, SerializableMap* map,
                                            SerializableMapArray* array, SerializableBlob* blob,
                                            MakeText makeText)
        : mType(type), mMap(map), mArray(array), mBlob(blob), mValue(makeText()) {}

}  // namespace pemaro
