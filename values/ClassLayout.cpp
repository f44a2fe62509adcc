// SPDX-License-Identifier: Apache-2.0

// Callers hold and derive from the value classes by value, so their layout is part of the library's
// interface: checked here, for the 64-bit targets that it has.

#include <cstddef>
#include <type_traits>

#include "values/ValueAccess.h"

namespace pemaro {

#pragma GCC diagnostic push
#pragma GCC diagnostic ignored "-Winvalid-offsetof"

struct ValueAccess::Layout {
    static_assert(sizeof(void*) == 8, "another target needs its own table");

    static_assert(offsetof(SerializableValue, mType) == 8);
    static_assert(offsetof(SerializableValue, mMap) == 16);
    static_assert(offsetof(SerializableValue, mArray) == 24);
    static_assert(offsetof(SerializableValue, mBlob) == 32);
    static_assert(offsetof(SerializableValue, mValue) == 40);
    static_assert(sizeof(SerializableValue) == 40 + sizeof(std::string));
    static_assert(std::is_same_v<decltype(SerializableValue::mType), uint32_t>);

    static_assert(std::is_base_of_v<DefaultEntries, SerializableMap>);
    static_assert(sizeof(Entries) == 40);
    static_assert(sizeof(SerializableMap) == 8 + sizeof(Entries) + sizeof(SerializableValue));

    static_assert(offsetof(SerializableMapArray, mElements) == 8);
    static_assert(sizeof(SerializableMapArray) == 8 + sizeof(Elements));

    static_assert(offsetof(SerializableBlob, mData) == 8);
    static_assert(offsetof(SerializableBlob, mSize) == 16);
    static_assert(sizeof(SerializableBlob) == 24);
};

#pragma GCC diagnostic pop

static_assert(VALUE_TYPE_NULL == 0 && VALUE_TYPE_UINT8 == 1 && VALUE_TYPE_INT8 == 2);
static_assert(VALUE_TYPE_UINT16 == 3 && VALUE_TYPE_INT16 == 4);
static_assert(VALUE_TYPE_UINT32 == 5 && VALUE_TYPE_INT32 == 6);
static_assert(VALUE_TYPE_FLOAT == 9 && VALUE_TYPE_BOOL == 11 && VALUE_TYPE_STRING == 12);
static_assert(VALUE_TYPE_OBJECT == 13 && VALUE_TYPE_ARRAY == 14 && VALUE_TYPE_BLOB == 15);

}  // namespace pemaro
