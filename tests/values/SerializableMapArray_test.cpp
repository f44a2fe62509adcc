// SPDX-License-Identifier: Apache-2.0
#include "pemaro/SerializableMapArray.h"

#include <gtest/gtest.h>

#include <memory>

#include "pemaro/SerializableMap.h"
#include "pemaro/Status.h"

namespace pemaro {
namespace {

SerializableMapArray read(const std::string& text) {
    SerializableMapArray array;
    EXPECT_EQ(array.unserialize(text), 0) << text;
    return array;
}

TEST(SerializableMapArray, KeepsTheOrderOfInsertion) {
    SerializableMapArray array;
    EXPECT_EQ(array.add(3), 0);
    EXPECT_EQ(array.add(std::string("x")), 0);
    EXPECT_EQ(array.add(true), 0);
    EXPECT_EQ(array.serialize(), "[3,\"x\",true]");
}

TEST(SerializableMapArray, SetReplacesAnElementThatIsThere) {
    SerializableMapArray array = read("[1,2]");
    EXPECT_EQ(array.set(1, std::string("x")), 0);
    EXPECT_EQ(array.set(2, 3), STATUS_INDEX_OUT_OF_BOUNDS);
    EXPECT_EQ(array.set(static_cast<unsigned long>(-1), 3), STATUS_INDEX_OUT_OF_BOUNDS);
    EXPECT_EQ(SerializableMapArray().set(0, 3), STATUS_INDEX_OUT_OF_BOUNDS);
    EXPECT_EQ(array.serialize(), "[1,\"x\"]");
}

TEST(SerializableMapArray, GetReachesAnElement) {
    SerializableMapArray array = read("[1,{\"k\":2}]");
    array.get(1).getValue<SerializableMap>().editValueFor("k") = 5;
    array.get(0) = std::string("new");
    const SerializableMapArray& constant = array;
    std::string text;
    EXPECT_EQ(constant.get(0).getValue(text), 0);
    EXPECT_EQ(text, "new");
    EXPECT_EQ(array.serialize(), "[\"new\",{\"k\":5}]");
}

TEST(SerializableMapArrayDeathTest, ConstantGetPastTheEndIsFatal) {
    const SerializableMapArray array = read("[1,2]");
    EXPECT_DEATH(array.get(2),
                 "index>=size\\(\\)\\|SerializableMap\\|.*operator.*: index=2 out of "
                 "range \\(2\\)\n");
    const SerializableMapArray empty;
    EXPECT_DEATH(empty.get(0),
                 "index>=size\\(\\)\\|SerializableMap\\|.*: index=0 out of range \\(0\\)\n");
}

TEST(SerializableMapArray, ClearRemovesEverything) {
    SerializableMapArray array = read("[1,[2,{\"a\":3}]]");
    array.clear();
    EXPECT_EQ(array.serialize(), "[]");
    array.add(1);
    EXPECT_EQ(array.serialize(), "[1]");
}

TEST(SerializableMapArray, AddsAndSetsAnElementOfItsOwn) {
    SerializableMapArray array = read("[{\"a\":1}]");
    for (int i = 0; i < 20; ++i) EXPECT_EQ(array.add(array.get(0)), 0);
    EXPECT_EQ(array.set(0, array.get(20)), 0);
    std::string expected = "[{\"a\":1}";
    for (int i = 0; i < 20; ++i) expected += ",{\"a\":1}";
    EXPECT_EQ(array.serialize(), expected + "]");
}

TEST(SerializableMapArray, CopiesShareNothing) {
    SerializableMapArray original = read("[1,[2]]");
    SerializableValue& flat = original.get(0);
    SerializableValue& nested = original.get(1).getValue<SerializableMapArray>().get(0);
    SerializableMapArray copy(original);
    SerializableMapArray assigned = read("[9]");
    assigned = original;
    flat = 3;
    nested = 4;
    EXPECT_EQ(copy.serialize(), "[1,[2]]");
    EXPECT_EQ(assigned.serialize(), "[1,[2]]");
    EXPECT_EQ(original.serialize(), "[3,[4]]");
}

TEST(SerializableMapArray, MayBeAssignedToItselfOrAnArrayThatItHolds) {
    SerializableMapArray array = read("[[1,[2]]]");
    array = *&array;
    EXPECT_EQ(array.serialize(), "[[1,[2]]]");
    array = array.get(0).getValue<SerializableMapArray>();
    EXPECT_EQ(array.serialize(), "[1,[2]]");
}

}  // namespace
}  // namespace pemaro
