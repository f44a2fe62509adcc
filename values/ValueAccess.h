// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstddef>
#include <string>

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

    static size_t size(const SerializableMap& m) { return entries(m).size(); }
    static size_t size(const SerializableMapArray& a) { return a.mElements.size(); }
    static const SerializableValue& at(const SerializableMap& m, size_t index) {
        return entries(m).valueAt(index);
    }
    static const SerializableValue& at(const SerializableMapArray& a, size_t index) {
        return a.mElements.itemAt(index);
    }
    static SerializableValue& edit(SerializableMap& m, size_t index) {
        return entries(m).editValueAt(index);
    }
    static SerializableValue& edit(SerializableMapArray& a, size_t index) {
        return a.mElements.editItemAt(index);
    }
};

}  // namespace pemaro
