// SPDX-License-Identifier: Apache-2.0
#include "pemaro/SerializableMap.h"

#include <gtest/gtest.h>

#include <memory>

#include "pemaro/SerializableMapArray.h"
#include "pemaro/Status.h"
#include "tests/support/MapText.h"

namespace pemaro {
namespace {

using test::mapOf;

int intUnder(SerializableMap& map, const std::string& key) {
    int value = -1;
    EXPECT_EQ(map.valueFor(key).getValue(value), 0);
    return value;
}

TEST(SerializableMap, IsEmptyAtFirst) {
    SerializableMap map;
    EXPECT_EQ(map.size(), 0u);
    EXPECT_EQ(map.serialize(), "{}");
}

TEST(SerializableMap, SortsKeysByTheirBytes) {
    SerializableMap map;
    for (const char* key : {"b", "\xff", "", "ab", "B", "a", "\x01"}) map.add(key, 1);
    const std::string kSorted[] = {"", "\x01", "B", "a", "ab", "b", "\xff"};
    for (size_t i = 0; i < std::size(kSorted); ++i) {
        std::string key;
        EXPECT_EQ(map.keyAt(i, key), 0);
        EXPECT_EQ(key, kSorted[i]);
    }
}

TEST(SerializableMap, AddReplacesTheValueOfAKeyThatIsThere) {
    SerializableMap map;
    map.add("a", 1);
    map.add("a", 2);
    map.replaceValueFor("b", 3);
    map.replaceValueFor("b", 4);
    EXPECT_EQ(map.serialize(), "{\"a\":2,\"b\":4}");
}

TEST(SerializableMap, AnAbsentKeyHasTheNullItem) {
    SerializableMap map;
    map.add("a", 1);
    EXPECT_EQ(map.getType("a"), VALUE_TYPE_INT32);
    EXPECT_EQ(map.getType("b"), VALUE_TYPE_NULL);
    SerializableValue item = map.valueFor("b");
    EXPECT_EQ(item.serialize(), "");
}

TEST(SerializableMap, CopiesKeysAndValuesOutByPosition) {
    SerializableMap map = mapOf("{\"a\":1,\"b\":2}");
    std::string key = "untouched";
    SerializableValue value(std::string("untouched"));
    EXPECT_EQ(map.keyAt(2, key), STATUS_BAD_PARAMETER);
    EXPECT_EQ(map.valueAt(2, value), STATUS_BAD_PARAMETER);
    EXPECT_EQ(map.keyAt(static_cast<unsigned long>(-1), key), STATUS_BAD_PARAMETER);
    EXPECT_EQ(key, "untouched");
    EXPECT_EQ(value.serialize(), "untouched");
    EXPECT_EQ(map.keyAt(1, key), 0);
    EXPECT_EQ(map.valueAt(1, value), 0);
    EXPECT_EQ(key, "b");
    EXPECT_EQ(value.serialize(), "2");
}

TEST(SerializableMap, ContainsExactKeysOnly) {
    SerializableMap map = mapOf("{\"a.b\":{\"c\":1}}");
    EXPECT_TRUE(map.contains("a.b"));
    EXPECT_TRUE(map.contains(std::string("a.b")));
    EXPECT_FALSE(map.contains("a"));
    EXPECT_FALSE(map.contains("a.b.c"));
    EXPECT_FALSE(map.contains(std::string("a.b\0", 4)));
    EXPECT_FALSE(SerializableMap().contains(""));
}

TEST(SerializableMapDeathTest, EditingAnAbsentKeyIsFatal) {
    SerializableMap map;
    EXPECT_DEATH(map.editValueFor("a"), "i<0\\|.*\\|.*editValueFor.*: key not found");
}

TEST(SerializableMap, ClearRemovesEverything) {
    SerializableMap map = mapOf("{\"a\":1,\"b\":{\"c\":[1]}}");
    EXPECT_EQ(map.clear(), 0);
    EXPECT_EQ(map.size(), 0u);
    map.add("a", 1);
    EXPECT_EQ(map.serialize(), "{\"a\":1}");
}

struct Merge {
    const char* left;
    const char* right;
    const char* merged;
};

const Merge kMerges[] = {
        {"{\"a\":1}", "{\"a\":2,\"b\":3}", "{\"a\":2,\"b\":3}"},
        {"{\"b\":1}", "{\"a\":2,\"c\":3}", "{\"a\":2,\"b\":1,\"c\":3}"},
        {"{\"a\":1,\"b\":2}", "{\"b\":3}", "{\"a\":1,\"b\":3}"},
        {"{\"a\":1,\"d\":2}", "{\"b\":3,\"c\":4,\"e\":5}",
         "{\"a\":1,\"b\":3,\"c\":4,\"d\":2,\"e\":5}"},
        {"{\"a\":{\"x\":1}}", "{\"a\":{\"y\":2},\"b\":[1,{\"z\":3}]}",
         "{\"a\":{\"y\":2},\"b\":[1,{\"z\":3}]}"},
};

TEST(SerializableMap, MergesTheOthersEntriesIn) {
    for (const Merge& merge : kMerges) {
        SCOPED_TRACE(merge.merged);
        SerializableMap left = mapOf(merge.left);
        const SerializableMap right = mapOf(merge.right);
        EXPECT_EQ((left + right).serialize(), merge.merged);
        EXPECT_EQ(left.serialize(), merge.left);
        EXPECT_EQ(&(left += right), &left);
        EXPECT_EQ(left.serialize(), merge.merged);
        EXPECT_EQ(right.serialize(), merge.right);
    }
}

TEST(SerializableMap, MergesWithEmptyMapsAndWithItself) {
    SerializableMap map = mapOf("{\"a\":1,\"b\":{\"c\":2}}");
    map += SerializableMap();
    map += map;
    EXPECT_EQ(map.serialize(), "{\"a\":1,\"b\":{\"c\":2}}");
    SerializableMap empty;
    empty += map;
    EXPECT_EQ(empty.serialize(), map.serialize());
}

TEST(SerializableMap, MergesWithAMapThatItHolds) {
    SerializableMap map = mapOf("{\"b\":{\"a\":1,\"b\":2}}");
    map += map.editValueFor("b").getValue<SerializableMap>();
    EXPECT_EQ(map.serialize(), "{\"a\":1,\"b\":2}");
}

TEST(SerializableMap, MergedEntriesAreCopies) {
    SerializableMap other = mapOf("{\"n\":{\"k\":1}}");
    SerializableMap& inner = other.editValueFor("n").getValue<SerializableMap>();
    SerializableMap map;
    map += other;
    const SerializableMap sum = map + other;
    inner.editValueFor("k") = 2;
    EXPECT_EQ(map.serialize(), "{\"n\":{\"k\":1}}");
    EXPECT_EQ(sum.serialize(), "{\"n\":{\"k\":1}}");
}

TEST(SerializableMap, CopiesShareNothing) {
    SerializableMap original = mapOf("{\"flat\":1,\"nested\":{\"k\":1}}");
    SerializableValue& flat = original.editValueFor("flat");
    SerializableMap& nested = original.editValueFor("nested").getValue<SerializableMap>();
    SerializableValue& nestedFlat = nested.editValueFor("k");
    SerializableMap copy(original);
    SerializableMap assigned = mapOf("{\"old\":1}");
    assigned = original;
    const SerializableMap copyOfNested(nested);
    flat = 2;
    nestedFlat = 3;
    EXPECT_EQ(copy.serialize(), "{\"flat\":1,\"nested\":{\"k\":1}}");
    EXPECT_EQ(assigned.serialize(), "{\"flat\":1,\"nested\":{\"k\":1}}");
    EXPECT_EQ(copyOfNested.serialize(), "{\"k\":1}");
    EXPECT_EQ(original.serialize(), "{\"flat\":2,\"nested\":{\"k\":3}}");
}

TEST(SerializableMap, OutlivesWhatItWasCopiedFrom) {
    auto original = std::make_unique<SerializableMap>(mapOf("{\"a\":[1,{\"b\":2}],\"c\":3}"));
    SerializableMap copy(*original);
    original.reset();
    EXPECT_EQ(copy.serialize(), "{\"a\":[1,{\"b\":2}],\"c\":3}");
}

TEST(SerializableMap, MayBeAssignedToItselfOrAMapThatItHolds) {
    SerializableMap map = mapOf("{\"a\":{\"b\":1}}");
    map = *&map;
    EXPECT_EQ(map.serialize(), "{\"a\":{\"b\":1}}");
    map = map.editValueFor("a").getValue<SerializableMap>();
    EXPECT_EQ(map.serialize(), "{\"b\":1}");
}

TEST(SerializableMap, AddsAValueThatItHolds) {
    SerializableMap map = mapOf("{\"a\":{\"b\":1}}");
    map.add("c", map.valueFor("a"));
    EXPECT_EQ(map.serialize(), "{\"a\":{\"b\":1},\"c\":{\"b\":1}}");
}

// What a caller copies of the base class shares its buffer with the map, until one of them is edited.
TEST(SerializableMap, ToleratesCopiesOfItsBaseClass) {
    using Entries = android::KeyedVector<std::string, SerializableValue>;
    auto map = std::make_unique<SerializableMap>(mapOf("{\"a\":{\"b\":[1]},\"c\":2}"));
    Entries entries = *map;
    map->editValueFor("a").getValue<SerializableMap>().add("d", 3);
    EXPECT_EQ(map->serialize(), "{\"a\":{\"b\":[1],\"d\":3},\"c\":2}");
    EXPECT_EQ(SerializableValue(entries.valueFor("a")).serialize(), "{\"b\":[1]}");

    entries = *map;
    EXPECT_EQ(map->clear(), 0);
    EXPECT_EQ(entries.size(), 2u);
    static_cast<Entries&>(*map) = entries;
    map.reset();
    EXPECT_EQ(entries.editValueFor("a").serialize(), "{\"b\":[1],\"d\":3}");
}

TEST(SerializableMap, CarriesItsNullItemAlong) {
    using DefaultEntries = android::DefaultKeyedVector<std::string, SerializableValue>;
    SerializableMap map = mapOf("{\"a\":1}");
    static_cast<DefaultEntries&>(map) = DefaultEntries(SerializableValue(7));
    EXPECT_EQ(intUnder(map, "absent"), 7);
    EXPECT_EQ(map.getType("absent"), VALUE_TYPE_INT32);

    SerializableMap copy(map);
    EXPECT_EQ(intUnder(copy, "absent"), 7);
    const SerializableMap other = mapOf("{\"b\":2}");
    SerializableMap sum = map + other;
    EXPECT_EQ(intUnder(sum, "absent"), 7);
    SerializableMap got;
    EXPECT_EQ(SerializableValue(map).getValue(got), 0);
    EXPECT_EQ(intUnder(got, "absent"), 7);
    // Reading replaces everything, the null item included.
    EXPECT_EQ(map.unserialize("{\"a\":1}"), 0);
    EXPECT_EQ(map.getType("absent"), VALUE_TYPE_NULL);
}

}  // namespace
}  // namespace pemaro
