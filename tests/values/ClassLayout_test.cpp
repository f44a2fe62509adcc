// SPDX-License-Identifier: Apache-2.0

// The virtual slots of the value classes: the complete destructor, the deleting destructor, and
// nothing else. Sizes and offsets are checked when the library is compiled.

#include <gtest/gtest.h>

#include <cstring>
#include <new>

#include "pemaro/SerializableBlob.h"
#include "pemaro/SerializableMap.h"
#include "pemaro/SerializableMapArray.h"
#include "pemaro/SerializableValue.h"

namespace pemaro {
namespace {

using Slot = int (*)(void*);

Slot slotOf(const void* object, size_t index) {
    const Slot* table = nullptr;
    memcpy(&table, object, sizeof(table));
    return table[index];
}

// A slot is called through a type of ours, which the function sanitizer would take for a mistake.
#if defined(__clang__)
__attribute__((no_sanitize("function")))
#endif
int callSlot(void* object, size_t index) {
    return slotOf(object, index)(object);
}

/// Adds a virtual function, which comes behind those of its base.
template <typename Base>
struct Probe : Base {
    explicit Probe(int& destroyed) : mDestroyed(destroyed) {}
    ~Probe() override { ++mDestroyed; }
    virtual int added() { return 42; }
    int& mDestroyed;
};

template <typename T>
class ClassLayout : public testing::Test {};
using Classes =
        testing::Types<SerializableValue, SerializableMap, SerializableMapArray, SerializableBlob>;
TYPED_TEST_SUITE(ClassLayout, Classes);

TYPED_TEST(ClassLayout, HasItsDestructorsAsItsOnlyVirtualSlots) {
    using Derived = Probe<TypeParam>;
    int destroyed = 0;

    void* const storage = ::operator new(sizeof(Derived));
    callSlot(new (storage) Derived(destroyed), 0);
    EXPECT_EQ(destroyed, 1);
    // The first slot left the storage alone.
    ::operator delete(storage);

    callSlot(new Derived(destroyed), 1);
    EXPECT_EQ(destroyed, 2);

    Derived probe(destroyed);
    EXPECT_EQ(callSlot(&probe, 2), 42);
}

TEST(ClassLayoutOfMap, TheKeyedVectorComesBehindTheTable) {
    const SerializableMap map;
    const auto* const base =
            static_cast<const android::KeyedVector<std::string, SerializableValue>*>(&map);
    EXPECT_EQ(reinterpret_cast<const char*>(base) - reinterpret_cast<const char*>(&map), 8);
}

}  // namespace
}  // namespace pemaro
