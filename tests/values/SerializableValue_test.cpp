// SPDX-License-Identifier: Apache-2.0
#include "pemaro/SerializableValue.h"

#include <gtest/gtest.h>

#include <climits>
#include <cmath>
#include <memory>

#include "pemaro/SerializableBlob.h"
#include "pemaro/SerializableMap.h"
#include "pemaro/SerializableMapArray.h"
#include "pemaro/Status.h"
#include "values/ValueAccess.h"

namespace pemaro {
namespace {

const std::string kFiftyZeros = "00000000000000000000000000000000000000000000000000";

int typeOf(const SerializableValue& value) {
    return static_cast<int>(ValueAccess::type(value));
}

std::string textOf(const SerializableValue& value) {
    return ValueAccess::text(value);
}

SerializableValue textValue(const std::string& text) {
    return SerializableValue(text);
}

SerializableMap mapOf(const std::string& key, const SerializableValue& value) {
    SerializableMap map;
    map.add(key, value);
    return map;
}

SerializableMapArray arrayOf(const SerializableValue& value) {
    SerializableMapArray array;
    array.add(value);
    return array;
}

struct Made {
    SerializableValue value;
    int type;
    std::string text;
};

TEST(SerializableValue, KeepsItsTypeAndItsTextFromEachConstructor) {
    const Made kMade[] = {
            {SerializableValue(static_cast<unsigned char>(0)), 1, "0"},
            {SerializableValue(static_cast<unsigned char>(255)), 1, "255"},
            {SerializableValue(static_cast<signed char>(-128)), 2, "-128"},
            {SerializableValue(static_cast<signed char>(127)), 2, "127"},
            {SerializableValue(static_cast<unsigned short>(65535)), 3, "65535"},
            {SerializableValue(static_cast<short>(-1)), 4, "-1"},
            {SerializableValue(static_cast<short>(-32768)), 4, "-32768"},
            {SerializableValue(UINT_MAX), 5, "4294967295"},
            {SerializableValue(INT_MIN), 6, "-2147483648"},
            {SerializableValue(INT_MAX), 6, "2147483647"},
            {SerializableValue(0.1f), 9, "0.100000"},
            {SerializableValue(1.5f), 9, "1.500000"},
            {SerializableValue(2.0f), 9, "2.000000"},
            {SerializableValue(-0.5f), 9, "-0.500000"},
            {SerializableValue(true), 11, "true"},
            {SerializableValue(false), 11, "false"},
            {SerializableValue(std::string("a\"b,{")), 12, "a\"b,{"},
            {SerializableValue(std::string()), 12, ""},
            {SerializableValue(std::string("x"), 99), 99, "x"},
            {SerializableValue(std::string("x"), -1), -1, "x"},
    };
    for (const Made& made : kMade) {
        SCOPED_TRACE(made.text);
        EXPECT_EQ(typeOf(made.value), made.type);
        EXPECT_EQ(textOf(made.value), made.text);
        EXPECT_EQ(SerializableValue(made.value).serialize(), made.text);
    }
}

TEST(SerializableValue, HasFiftyZerosWhenMadeOfNothingOrOfAContainer) {
    EXPECT_EQ(typeOf(SerializableValue()), VALUE_TYPE_NULL);
    EXPECT_EQ(SerializableValue().serialize(), kFiftyZeros);
    const SerializableValue kContainers[] = {
            SerializableValue(),
            SerializableValue(SerializableMap()),
            SerializableValue(SerializableMapArray()),
            SerializableValue(SerializableBlob()),
    };
    const int kTypes[] = {0, 13, 14, 15};
    for (size_t i = 0; i < std::size(kContainers); ++i) {
        EXPECT_EQ(typeOf(kContainers[i]), kTypes[i]);
        EXPECT_EQ(textOf(kContainers[i]), kFiftyZeros);
    }
}

TEST(SerializableValue, ACopyWithAContainerTagHasNoText) {
    const SerializableValue null;
    EXPECT_EQ(SerializableValue(null).serialize(), "");
    const SerializableValue map{SerializableMap()};
    EXPECT_EQ(textOf(SerializableValue(map)), "");
    const SerializableValue array{SerializableMapArray()};
    EXPECT_EQ(textOf(SerializableValue(array)), "");
    const SerializableValue blob{SerializableBlob()};
    EXPECT_EQ(textOf(SerializableValue(blob)), "");
    EXPECT_EQ(textOf(SerializableValue(textValue("x"))), "x");
}

template <typename T>
struct Got {
    std::string text;
    int status;
    T value;  ///< when the status is 0
};

template <typename T, size_t N>
void expectGot(const Got<T> (&rows)[N], T untouched) {
    for (const Got<T>& row : rows) {
        SCOPED_TRACE(row.text);
        T value = untouched;
        EXPECT_EQ(textValue(row.text).getValue(value), row.status);
        EXPECT_EQ(value, row.status == 0 ? row.value : untouched);
    }
}

constexpr int kBad = STATUS_INVALID_FORMAT;

TEST(SerializableValueGetters, ReadUnsignedChar) {
    const Got<unsigned char> kRows[] = {{"7", 0, 7},     {"-1", 0, 255}, {"257", 0, 1},
                                        {" \t8x", 0, 8}, {"x", kBad, 0}, {"", kBad, 0}};
    expectGot<unsigned char>(kRows, 99);
}

TEST(SerializableValueGetters, ReadSignedChar) {
    const Got<signed char> kRows[] = {{"-7", 0, -7}, {"200", 0, -56}, {"-129", 0, 127},
                                      {"+5", 0, 5},  {"-", kBad, 0},  {"--1", kBad, 0}};
    expectGot<signed char>(kRows, 99);
}

TEST(SerializableValueGetters, ReadUnsignedShort) {
    const Got<unsigned short> kRows[] = {
            {"65535", 0, 65535}, {"-5", 0, 65531}, {"65536", 0, 0}, {"1.5", 0, 1}, {".5", kBad, 0}};
    expectGot<unsigned short>(kRows, 99);
}

TEST(SerializableValueGetters, ReadShort) {
    const Got<short> kRows[] = {
            {"-32768", 0, -32768}, {"32768", 0, -32768}, {"12abc", 0, 12}, {"abc", kBad, 0}};
    expectGot<short>(kRows, 99);
}

TEST(SerializableValueGetters, ReadUnsignedInt) {
    const Got<unsigned int> kRows[] = {
            {"4294967295", 0, 4294967295u},           {"4294967296", 0, 0}, {"-1", 0, 4294967295u},
            {"99999999999999999999", 0, 4294967295u}, {"0x10", 0, 0},       {"true", kBad, 0}};
    expectGot<unsigned int>(kRows, 99);
}

TEST(SerializableValueGetters, ReadInt) {
    const Got<int> kRows[] = {{"-2147483648", 0, INT_MIN},
                              {"4294967297", 0, 1},
                              {"1.500000", 0, 1},
                              {"12abc", 0, 12},
                              {"0012", 0, 12},
                              {"99999999999999999999", 0, -1},
                              {"-99999999999999999999", 0, 0},
                              {"", kBad, 0},
                              {" ", kBad, 0}};
    expectGot<int>(kRows, 99);
}

TEST(SerializableValueGetters, ReadFloat) {
    const Got<float> kRows[] = {{"1.250000", 0, 1.25f}, {"-3", 0, -3.0f},    {".5", 0, 0.5f},
                                {"5.", 0, 5.0f},        {"1e3", 0, 1000.f},  {"0x1p4", 0, 16.0f},
                                {"inf", 0, INFINITY},   {" +2.5,", 0, 2.5f}, {"1e39", 0, INFINITY},
                                {"1e-45", 0, 1.4e-45f}, {".", kBad, 0},      {"x", kBad, 0},
                                {"", kBad, 0},          {"-", kBad, 0}};
    expectGot<float>(kRows, 99);
}

TEST(SerializableValueGetters, ReadBool) {
    const Got<bool> kRows[] = {
            {"true", 0, true},       {"TRUE", 0, true},      {"true1", 0, true},
            {"false", 0, false},     {"FALSE", 0, false},    {"False!", 0, false},
            {"falsehood", 0, false}, {"truly", kBad, false}, {"tru", kBad, false},
            {"fals", kBad, false},   {"12abc", kBad, false}, {"1", kBad, false},
            {"null", kBad, false},   {" true", kBad, false}, {"", kBad, false}};
    expectGot<bool>(kRows, false);
    expectGot<bool>(kRows, true);
}

TEST(SerializableValueGetters, ReadAnyTextTagAsAString) {
    for (const int type : {1, 2, 3, 4, 5, 6, 7, 8, 9, 10, 11, 12, 16, 99}) {
        std::string text = "untouched";
        EXPECT_EQ(SerializableValue("x", type).getValue(text), 0) << type;
        EXPECT_EQ(text, "x");
    }
}

TEST(SerializableValueGetters, DoNotCareHowANumberWasMade) {
    unsigned short asShort = 0;
    EXPECT_EQ(SerializableValue(-5).getValue(asShort), 0);
    EXPECT_EQ(asShort, 65531);
    int asInt = 0;
    EXPECT_EQ(SerializableValue(1.5f).getValue(asInt), 0);
    EXPECT_EQ(asInt, 1);
    float asFloat = 0;
    EXPECT_EQ(SerializableValue(3).getValue(asFloat), 0);
    EXPECT_EQ(asFloat, 3.0f);
    unsigned int asUnsigned = 0;
    EXPECT_EQ(SerializableValue(static_cast<short>(-1)).getValue(asUnsigned), 0);
    EXPECT_EQ(asUnsigned, 4294967295u);
    EXPECT_EQ(SerializableValue("42", 99).getValue(asInt), 0);
    EXPECT_EQ(asInt, 42);
}

/// Every scalar getter refuses the value and leaves its output alone.
template <typename T>
void expectRefused(const SerializableValue& value, T untouched) {
    T output = untouched;
    EXPECT_EQ(value.getValue(output), STATUS_INVALID_FORMAT);
    EXPECT_EQ(output, untouched);
}

TEST(SerializableValueGetters, RefuseContainerTags) {
    for (const int type : {0, 13, 14, 15}) {
        SCOPED_TRACE(type);
        const SerializableValue value("1", type);
        expectRefused<unsigned char>(value, 9);
        expectRefused<signed char>(value, 9);
        expectRefused<unsigned short>(value, 9);
        expectRefused<short>(value, 9);
        expectRefused<unsigned int>(value, 9);
        expectRefused<int>(value, 9);
        expectRefused<float>(value, 9);
        expectRefused<bool>(value, true);
        expectRefused<std::string>(value, "untouched");
    }
}

TEST(SerializableValueGetters, ReplaceAContainerByACopyOfTheirs) {
    const SerializableValue map(mapOf("k", 1));
    SerializableMap gotMap = mapOf("old", 2);
    EXPECT_EQ(map.getValue(gotMap), 0);
    EXPECT_EQ(gotMap.serialize(), "{\"k\":1}");

    const SerializableValue array(arrayOf(3));
    SerializableMapArray gotArray = arrayOf(4);
    EXPECT_EQ(array.getValue(gotArray), 0);
    EXPECT_EQ(gotArray.serialize(), "[3]");

    const SerializableValue blob(SerializableBlob("abc", 3));
    SerializableBlob gotBlob;
    EXPECT_EQ(blob.getValue(gotBlob), 0);
    EXPECT_EQ(gotBlob.getSize(), 3u);

    gotMap.editValueFor("k") = 5;
    EXPECT_EQ(SerializableValue(map).serialize(), "{\"k\":1}");
}

TEST(SerializableValueGetters, RefuseAnotherContainer) {
    const SerializableValue kValues[] = {
            SerializableValue(), SerializableValue(1), SerializableValue(SerializableMap()),
            SerializableValue(SerializableMapArray()), SerializableValue(SerializableBlob())};
    for (const SerializableValue& value : kValues) {
        SCOPED_TRACE(typeOf(value));
        SerializableMap map = mapOf("kept", 1);
        if (typeOf(value) != VALUE_TYPE_OBJECT) {
            EXPECT_EQ(value.getValue(map), STATUS_INVALID_FORMAT);
            EXPECT_EQ(map.serialize(), "{\"kept\":1}");
        }
        SerializableMapArray array = arrayOf(1);
        if (typeOf(value) != VALUE_TYPE_ARRAY) {
            EXPECT_EQ(value.getValue(array), STATUS_INVALID_FORMAT);
            EXPECT_EQ(array.serialize(), "[1]");
        }
        SerializableBlob blob("ab", 2);
        if (typeOf(value) != VALUE_TYPE_BLOB) {
            EXPECT_EQ(value.getValue(blob), STATUS_INVALID_FORMAT);
            EXPECT_EQ(blob.getSize(), 2u);
        }
    }
}

TEST(SerializableValueGetters, MayReplaceTheMapThatHoldsTheValue) {
    SerializableMap map = mapOf("sub", mapOf("k", 1));
    EXPECT_EQ(map.editValueFor("sub").getValue(map), 0);
    EXPECT_EQ(map.serialize(), "{\"k\":1}");
}

TEST(SerializableValueReferences, ReachWhatTheValueHolds) {
    SerializableValue text(std::string("pen"));
    text.getValue<std::string>() += "cil";
    EXPECT_EQ(text.serialize(), "pencil");

    SerializableValue map(mapOf("k", 1));
    map.getValue<SerializableMap>().add("l", 2);
    EXPECT_EQ(map.serialize(), "{\"k\":1,\"l\":2}");

    SerializableValue array(arrayOf(1));
    array.getValue<SerializableMapArray>().add(2);
    EXPECT_EQ(array.serialize(), "[1,2]");
}

TEST(SerializableValueReferencesDeathTest, AskingForAnotherTypeIsFatal) {
    const char* const kText =
            "!\\(mType != VALUE_TYPE_NULL && mType != VALUE_TYPE_OBJECT && mType != "
            "VALUE_TYPE_ARRAY && mType != VALUE_TYPE_BLOB\\)\\|SerializableMap\\|getValue\\(\\) "
            "return type must match object type\n";
    const char* const kMap =
            "!\\(mType == VALUE_TYPE_OBJECT\\)\\|SerializableMap\\|getValue\\(\\) "
            "return type must match object type\n";
    const char* const kArray =
            "!\\(mType == VALUE_TYPE_ARRAY\\)\\|SerializableMap\\|getValue\\(\\) "
            "return type must match object type\n";
    for (const int type : {0, 13, 14, 15}) {
        SerializableValue value("x", type);
        EXPECT_DEATH(value.getValue<std::string>(), kText) << type;
    }
    for (const int type : {0, 1, 9, 12, 14, 15, 99}) {
        SerializableValue value("x", type);
        EXPECT_DEATH(value.getValue<SerializableMap>(), kMap) << type;
    }
    for (const int type : {0, 1, 9, 12, 13, 15, 99}) {
        SerializableValue value("x", type);
        EXPECT_DEATH(value.getValue<SerializableMapArray>(), kArray) << type;
    }
}

TEST(SerializableValueCopies, ShareNothing) {
    SerializableValue original(mapOf("list", arrayOf(mapOf("k", 1))));
    SerializableMap& inner = original.getValue<SerializableMap>()
                                     .editValueFor("list")
                                     .getValue<SerializableMapArray>()
                                     .get(0)
                                     .getValue<SerializableMap>();
    SerializableValue copy(original);
    SerializableValue assigned;
    assigned = original;
    // Reached before the copies were made, so that nothing tells the platform's vectors of the edit.
    inner.editValueFor("k") = 2;
    EXPECT_EQ(copy.serialize(), "{\"list\":[{\"k\":1}]}");
    EXPECT_EQ(assigned.serialize(), "{\"list\":[{\"k\":1}]}");
    EXPECT_EQ(original.serialize(), "{\"list\":[{\"k\":2}]}");
}

TEST(SerializableValueCopies, HaveABlobOfTheirOwn) {
    auto original = std::make_unique<SerializableValue>(SerializableBlob("abc", 3));
    SerializableValue copy(*original);
    original.reset();
    SerializableBlob blob;
    EXPECT_EQ(copy.getValue(blob), 0);
    char bytes[3];
    EXPECT_EQ(blob.getValue(bytes, 3), 3u);
    EXPECT_EQ(std::string(bytes, 3), "abc");
}

TEST(SerializableValueCopies, MayBeAssignedToThemselvesOrToWhatHoldsThem) {
    SerializableValue value(mapOf("k", mapOf("l", 1)));
    value = *&value;
    EXPECT_EQ(value.serialize(), "{\"k\":{\"l\":1}}");
    value = value.getValue<SerializableMap>().editValueFor("k");
    EXPECT_EQ(value.serialize(), "{\"l\":1}");
}

TEST(SerializableValue, SwapsTypesContentsAndTexts) {
    SerializableValue map(mapOf("k", 1));
    SerializableValue null;
    map.swap(null);
    EXPECT_EQ(typeOf(map), VALUE_TYPE_NULL);
    EXPECT_EQ(map.serialize(), kFiftyZeros);
    EXPECT_EQ(null.serialize(), "{\"k\":1}");
}

TEST(SerializableValue, IsAnEmptyContainerWhenOnlyTheTagSaysSo) {
    SerializableValue map("x", VALUE_TYPE_OBJECT);
    SerializableValue array("x", VALUE_TYPE_ARRAY);
    SerializableValue blob("x", VALUE_TYPE_BLOB);
    EXPECT_EQ(map.serialize(), "{}");
    EXPECT_EQ(array.serialize(), "[]");
    EXPECT_EQ(blob.serialize(), "blob");

    SerializableMap holder;
    holder.add("m", map);
    holder.add("a", array);
    holder.add("b", blob);
    SerializableMap copy(holder);
    EXPECT_EQ(copy.serialize(), "{\"a\":[],\"b\":blob,\"m\":{}}");

    SerializableMap gotMap = mapOf("k", 1);
    EXPECT_EQ(map.getValue(gotMap), 0);
    EXPECT_EQ(gotMap.size(), 0u);
    SerializableMapArray gotArray = arrayOf(1);
    EXPECT_EQ(array.getValue(gotArray), 0);
    EXPECT_EQ(gotArray.serialize(), "[]");
    SerializableBlob gotBlob("a", 1);
    EXPECT_EQ(blob.getValue(gotBlob), 0);
    EXPECT_EQ(gotBlob.getSize(), 0u);

    map.getValue<SerializableMap>().add("k", 1);
    array.getValue<SerializableMapArray>().add(1);
    EXPECT_EQ(map.serialize(), "{\"k\":1}");
    EXPECT_EQ(array.serialize(), "[1]");
}

}  // namespace
}  // namespace pemaro
