// SPDX-License-Identifier: Apache-2.0
#include <gtest/gtest.h>

#include "pemaro/SerializableBlob.h"
#include "pemaro/SerializableMap.h"
#include "pemaro/SerializableMapArray.h"

namespace pemaro {
namespace {

TEST(TextWriter, WritesEachKindOfValueInTheOrderOfTheKeys) {
    SerializableMapArray list;
    list.add(static_cast<unsigned char>(7));
    list.add(std::string("x"));
    SerializableMap sub;
    sub.add("k", static_cast<short>(-2));

    SerializableMap map;
    map.add("name", std::string("pen"));
    map.add("count", 3);
    map.add("gain", 1.25f);
    map.add("on", true);
    map.add("list", list);
    map.add("sub", sub);
    map.add("raw", SerializableBlob("\1\2\3\4", 4));
    EXPECT_EQ(map.serialize(),
              "{\"count\":3,\"gain\":1.250000,\"list\":[7,\"x\"],\"name\":\"pen\",\"on\":true,"
              "\"raw\":blob,\"sub\":{\"k\":-2}}");
    EXPECT_EQ(SerializableValue(map).serialize(), map.serialize());
    EXPECT_EQ(SerializableValue(list).serialize(), "[7,\"x\"]");
}

TEST(TextWriter, WritesEmptyContainersAsTheirBrackets) {
    EXPECT_EQ(SerializableMap().serialize(), "{}");
    EXPECT_EQ(SerializableMapArray().serialize(), "[]");
    SerializableMap map;
    map.add("a", SerializableMapArray());
    map.add("m", SerializableMap());
    EXPECT_EQ(map.serialize(), "{\"a\":[],\"m\":{}}");
}

TEST(TextWriter, WritesANullValueAsNothing) {
    SerializableMap map;
    map.add("a", SerializableValue());
    EXPECT_EQ(map.serialize(), "{\"a\":}");
    map.add("b", 1);
    EXPECT_EQ(map.serialize(), "{\"a\":,\"b\":1}");

    SerializableMapArray array;
    array.add(1);
    array.add(SerializableValue());
    array.add(2);
    EXPECT_EQ(array.serialize(), "[1,,2]");
    // Not even when the fifty zeros of a null value get into a container.
    SerializableValue null;
    array.get(1).swap(null);
    EXPECT_EQ(array.serialize(), "[1,,2]");
}

TEST(TextWriter, WritesKeysAndStringsRaw) {
    SerializableMap map;
    map.add("a:b,c", std::string("x\"y\\,{z"));
    EXPECT_EQ(map.serialize(), "{\"a:b,c\":\"x\"y\\,{z\"}");
    EXPECT_EQ(SerializableValue(std::string("a\"b")).serialize(), "a\"b");
    const std::string withNul("a\0b", 3);
    map.clear();
    map.add(withNul, withNul);
    EXPECT_EQ(map.serialize(), "{\"" + withNul + "\":\"" + withNul + "\"}");
}

TEST(TextWriter, QuotesStringsAlone) {
    for (const int type : {1, 2, 3, 4, 5, 6, 7, 8, 9, 10, 11, 16, 99}) {
        SerializableMap map;
        map.add("a", SerializableValue("x", type));
        EXPECT_EQ(map.serialize(), "{\"a\":x}") << type;
    }
    SerializableMap map;
    map.add("a", SerializableValue("x", VALUE_TYPE_STRING));
    EXPECT_EQ(map.serialize(), "{\"a\":\"x\"}");
}

}  // namespace
}  // namespace pemaro
