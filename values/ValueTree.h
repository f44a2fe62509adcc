// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "pemaro/SerializableMap.h"
#include "pemaro/SerializableMapArray.h"

/// What concerns a whole tree of values. Each of these takes time linear in the tree and walks it
/// with a work list on the heap, so that the depth of a tree never reaches the stack.
namespace pemaro {

/// The value that null items of maps are copied from. It exists from the load of the library on.
const SerializableValue& defaultValue();

/// Replaces what `to` holds by copies of the entries or elements of `from`. Nothing is shared. The
/// null item of `to` itself stays.
void copyTree(const SerializableMap& from, SerializableMap& to);
void copyTree(const SerializableMapArray& from, SerializableMapArray& to);

/// Takes the contents of `from`, which is left empty, into `to`, whose own are destroyed.
void moveTree(SerializableMap& from, SerializableMap& to);
void moveTree(SerializableMapArray& from, SerializableMapArray& to);

/// Destroys the maps and arrays held by the values of a container that is about to be destroyed.
void destroyNested(SerializableMap& map);
void destroyNested(SerializableMapArray& array);

}  // namespace pemaro
