// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "pemaro/SerializableMap.h"
#include "pemaro/SerializableMapArray.h"

/// What concerns a whole tree of values. Each of these takes time linear in the tree and walks it
/// with a work list on the heap, so that the depth of a tree never reaches the stack.
namespace pemaro {

/// The value that null items of maps are copied from. It exists from the load of the library on.
const SerializableValue& defaultValue();

/// Copies the entries and the null item of `from`, or the elements of `from`, into `to`, which is
/// new. Nothing is shared.
void copyTree(const SerializableMap& from, SerializableMap& to);
void copyTree(const SerializableMapArray& from, SerializableMapArray& to);

/// Takes the contents of `from`, which is left empty, into `to`, whose own are destroyed.
void moveTree(SerializableMap& from, SerializableMap& to);
void moveTree(SerializableMapArray& from, SerializableMapArray& to);

/// Destroys the maps and arrays held by the values of a container that is about to be destroyed.
void destroyNested(SerializableMap& map);
void destroyNested(SerializableMapArray& array);

/// Gives an empty container `count` values without text, to be filled in place: they do not move
/// while none is added or removed. A map's keys come in ascending order from `keyAt(index)`.
void appendEmpty(SerializableMapArray& array, size_t count);
template <typename KeyAt>
void appendEmpty(SerializableMap& map, size_t count, KeyAt keyAt) {
    android::KeyedVector<std::string, SerializableValue>& entries = map;
    entries.setCapacity(count);
    for (size_t i = 0; i < count; ++i) entries.add(keyAt(i), defaultValue());
}

}  // namespace pemaro
