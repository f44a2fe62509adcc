// SPDX-License-Identifier: Apache-2.0

// Reading maps and arrays. Expected contents are shown as tag(text), with key= before it in a map and
// a map's or array's own values between its brackets.

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <sstream>

#include "pemaro/SerializableBlob.h"
#include "pemaro/SerializableMap.h"
#include "pemaro/SerializableMapArray.h"
#include "pemaro/Status.h"
#include "pemaro/testkit/LogRecorder.h"
#include "tests/values/reference/ReferenceTree.h"

namespace pemaro {
namespace {

using test::LogLine;
using test::LogRecorder;
using testing::IsEmpty;

struct Accepted {
    const char* text;
    const char* contents;
};

struct Refused {
    const char* text;
    std::vector<const char*> messages;
};

template <typename Container>
std::string contentsOf(const Container& container) {
    std::ostringstream out;
    out << reference::treeOf(container);
    return out.str();
}

template <typename Container, size_t N>
void expectAccepted(const Accepted (&rows)[N]) {
    for (const Accepted& row : rows) {
        SCOPED_TRACE(row.text);
        Container target;
        LogRecorder::instance().clear();
        EXPECT_EQ(target.unserialize(row.text), 0);
        EXPECT_EQ(contentsOf(target), row.contents);
        EXPECT_THAT(LogRecorder::instance().lines(), IsEmpty());
    }
}

template <size_t N, typename Container>
void expectRefused(const Refused (&rows)[N], Container target) {
    const std::string before = contentsOf(target);
    for (const Refused& row : rows) {
        SCOPED_TRACE(row.text);
        LogRecorder::instance().clear();
        EXPECT_EQ(target.unserialize(row.text), STATUS_INVALID_FORMAT);
        EXPECT_EQ(contentsOf(target), before);
        std::vector<LogLine> lines;
        for (const char* message : row.messages) lines.push_back({6, "SerializableMap", message});
        EXPECT_EQ(LogRecorder::instance().lines(), lines);
    }
}

TEST(MapReader, TagsScalarsByTheirShape) {
    const Accepted kRows[] = {
            {"{\"a\":3}", "13( a=9(3))"},
            {"{\"a\":-3}", "13( a=5(-3))"},
            {"{\"a\":.5}", "13( a=6(.5))"},
            {"{\"a\":1.250000}", "13( a=9(1.250000))"},
            {"{\"a\":true,\"b\":false,\"c\":null}", "13( a=11(true) b=11(false) c=11(null))"},
            {"{\"a\":\"x\"}", "13( a=12(x))"},
            {"{\"a\":blob}", "13( a=9(blob))"},
            {"{\"a\":\"\"}", "13( a=12())"},
    };
    expectAccepted<SerializableMap>(kRows);
}

TEST(MapReader, SkipsWhiteSpaceAroundTokens) {
    const Accepted kRows[] = {
            {" { \"a\" : 1 , \"b\" :\"x\" } ", "13( a=9(1) b=12(x))"},
            {"{\t\"a\"\r\n:\v\f1\t\r\n\v\f}", "13( a=9(1))"},
            {"{\"a\":1 2}", "13( a=9(1 2))"},
            {"{\"a\" : { \"b\" : [ 1 , 2 ] } }", "13( a=13( b=14( 9(1) 9(2))))"},
    };
    expectAccepted<SerializableMap>(kRows);
}

TEST(MapReader, IgnoresWhatStandsOutsideTheOutermostBraces) {
    const Accepted kRows[] = {
            {"xx{\"a\":1}yy", "13( a=9(1))"},
            {"[\"b\"]{\"a\":1}]\"", "13( a=9(1))"},
    };
    expectAccepted<SerializableMap>(kRows);
}

TEST(MapReader, EndsATokenAtACommaEvenBehindTheClosingBrace) {
    const Accepted kRows[] = {{"{\"a\":1},2", "13( a=9(1}))"}};
    expectAccepted<SerializableMap>(kRows);
}

TEST(MapReader, AcceptsAnythingBetweenAValueAndTheNextKey) {
    const Accepted kRows[] = {
            {"{\"a\":{\"x\":1}\"b\":2}", "13( a=13( x=9(1)) b=9(2))"},
            {"{\"a\":[1]junk,,\"b\":2}", "13( a=14( 9(1)) b=9(2))"},
            {"{,,x \"a\":1,,;\"b\":2}", "13( a=9(1) b=9(2))"},
    };
    expectAccepted<SerializableMap>(kRows);
}

TEST(MapReader, KeepsLastOfDuplicateKeys) {
    const Accepted kRows[] = {
            {"{\"a\":1,\"b\":2,\"a\":3}", "13( a=9(3) b=9(2))"},
            {"{\"b\":{\"x\":1},\"a\":0,\"b\":[1],\"b\":4}", "13( a=9(0) b=9(4))"},
            {"{\"a\":1,\"a\":{\"x\":2}}", "13( a=13( x=9(2)))"},
    };
    expectAccepted<SerializableMap>(kRows);
}

TEST(MapReader, KeepsLastOfManyDuplicateKeys) {
    std::string text = "{";
    for (int i = 0; i < 300; ++i) {
        text += "\"k" + std::to_string(i % 7) + "\":" + std::to_string(i) + ",";
    }
    SerializableMap map;
    EXPECT_EQ(map.unserialize(text + "\"z\":0}"), 0);
    EXPECT_EQ(map.serialize(),
              "{\"k0\":294,\"k1\":295,\"k2\":296,\"k3\":297,\"k4\":298,\"k5\":299,\"k6\":293,"
              "\"z\":0}");
}

// A few bytes behind what all keys begin with are compared at once; the rest is when those are the same.
TEST(MapReader, SortsKeysThatDifferFarBehindTheirBeginning) {
    SerializableMap map;
    ASSERT_EQ(0, map.unserialize(R"({"aaaaaaaaaaaaaaaa2":1,"b":2,"aaaaaaaaaaaaaaaa1":3,)"
                                 R"("aaaaaaaaaaaaaaaa":4,"aaaaaaaaaaaaaaaa2":5})"));
    EXPECT_EQ(R"({"aaaaaaaaaaaaaaaa":4,"aaaaaaaaaaaaaaaa1":3,"aaaaaaaaaaaaaaaa2":5,"b":2})",
              map.serialize());
}

TEST(MapReader, DropsAKeyWithNothingBehindItsColon) {
    const Accepted kRows[] = {
            {"{\"a\":}", "13()"},
            {"{\"a\": }", "13()"},
            {"{\"a\":1,\"b\":\t}", "13( a=9(1))"},
            {"{\"a\"}:1", "13()"},
    };
    expectAccepted<SerializableMap>(kRows);
}

TEST(MapReader, KeepsBackslashesInKeysAndStrings) {
    const Accepted kRows[] = {
            {"{\"a\\\"b\":\"c\\\"d\"}", "13( a\\\"b=12(c\\\"d))"},
    };
    expectAccepted<SerializableMap>(kRows);
}

TEST(MapReader, KeepsCommasAndBracketsInStrings) {
    const Accepted kRows[] = {
            {"{\"a\":\"x,y\",\"b\":\"{[\",\"c\":{\"d\":\"}]\"}}",
             "13( a=12(x,y) b=12({[) c=13( d=12(}])))"},
    };
    expectAccepted<SerializableMap>(kRows);
}

TEST(MapReader, SplitsAStringAtAnUnescapedQuote) {
    SerializableMap written;
    written.add("a", std::string("x\",\"y"));
    SerializableMap read;
    EXPECT_EQ(written.serialize(), "{\"a\":\"x\",\"y\"}");
    EXPECT_EQ(read.unserialize(written.serialize()), STATUS_INVALID_FORMAT);
}

TEST(MapReader, StopsAtTheFirstNul) {
    SerializableMap map;
    EXPECT_EQ(map.unserialize(std::string("{\"a\":1}\0,\"b\":2}", 15)), 0);
    EXPECT_EQ(contentsOf(map), "13( a=9(1))");
    EXPECT_EQ(map.unserialize(std::string("{\"a\":1\0}", 8)), STATUS_INVALID_FORMAT);
}

TEST(MapReader, ReplacesAllOfTheTarget) {
    SerializableMap map;
    map.add("old", SerializableMapArray());
    EXPECT_EQ(map.unserialize("{\"a\":1}"), 0);
    EXPECT_EQ(map.serialize(), "{\"a\":1}");
    EXPECT_EQ(map.unserialize("{\"a\":}"), 0);
    EXPECT_EQ(map.serialize(), "{}");
}

constexpr const char* kInKey = "invalid format: in key";
constexpr const char* kNoKey = "invalid format (a colon must follow key in map)";

TEST(MapReader, LogsTheReasonOfEachFailureAndLeavesTheTarget) {
    const Refused kRows[] = {
            {"", {"invalid format (should start with a brace)"}},
            {"\"a\":1}", {"invalid format (should start with a brace)"}},
            {"}{\"a\":1", {"invalid format (should end with a brace)"}},
            {"{}", {kNoKey, kInKey}},
            {"{a:1}", {kNoKey, kInKey}},
            {"{\"a:1}", {kNoKey, kInKey}},
            {"{\"a\" 1}", {kNoKey, kInKey}},
            {"{\"\":1}", {kNoKey, kInKey}},
            {"{\"a\":1,b}", {kNoKey, kInKey}},
            {"{\"a\":1,\"b\"}", {kNoKey, kInKey}},
            {"{\"a\":{\"b\":{\"c\":1}", {"invalid map data"}},
            {"{\"a\":{\"b\":\"}\"", {"invalid map data"}},
            {"{\"a\":[1}", {"invalid array data"}},
            {"{\"a\":[\"]\"}", {"invalid array data"}},
            {"{\"a\":{}}", {kNoKey, kInKey, "invalid format: unserialize failed 1"}},
            {"{\"a\":[{}]}",
             {kNoKey, kInKey, "invalid format: unserialize array failed 1",
              "invalid format: unserialize failed"}},
            {"{\"a\":[[{]]}",
             {"invalid map data", "invalid format: unserialize array failed",
              "invalid format: unserialize failed"}},
            {"{\"a\":{\"b\":[{\"c\":{}}]}}",
             {kNoKey, kInKey, "invalid format: unserialize failed 1",
              "invalid format: unserialize array failed 1", "invalid format: unserialize failed",
              "invalid format: unserialize failed 1"}},
            {"{\"a\":\"x}", {"pemaro: ERROR", kNoKey, kInKey}},
            {"{\"a\":x\"b\":y\"c}", {"pemaro: ERROR", "pemaro: ERROR", kNoKey, kInKey}},
    };
    SerializableMap target;
    target.add("kept", 1);
    target.add("too", SerializableMap());
    expectRefused(kRows, target);
}

struct Unended {
    const char* text;
    const char* contents;
    size_t errors;
};

template <typename Container, size_t N>
void expectUnended(const Unended (&rows)[N]) {
    for (const Unended& row : rows) {
        SCOPED_TRACE(row.text);
        LogRecorder::instance().clear();
        Container target;
        EXPECT_EQ(target.unserialize(row.text), 0);
        EXPECT_EQ(contentsOf(target), row.contents);
        const LogLine error{6, "SerializableMap", "pemaro: ERROR"};
        EXPECT_EQ(LogRecorder::instance().lines(), std::vector<LogLine>(row.errors, error));
    }
}

TEST(MapReader, StoresANullValueForATokenWithoutAnEndAndGoesOnBehindItsStart) {
    const Unended kRows[] = {
            {"{\"a\":x\"b\":\"}", "13( a=0() b=0())", 2},
            // The quote behind the backslashes closes nothing, and then opens a key.
            {"{\"a\":\"b\\\\\",\"c\":\"d\"}", "13( ,=12(d) a=0())", 1},
    };
    expectUnended<SerializableMap>(kRows);
}

TEST(ArrayReader, ReadsElementsInOrder) {
    const Accepted kRows[] = {
            {"[]", "14()"},
            {"[ \t]", "14()"},
            {"[3,-3,.5,\"x,y\",true,null,blob]",
             "14( 9(3) 5(-3) 6(.5) 12(x,y) 11(true) 11(null) 9(blob))"},
            {" x [ 1 , [ ],{\"a\":[2]}, [3]] y ", "14( 9(1) 14() 13( a=14( 9(2))) 14( 9(3)))"},
            {"[1,]", "14( 9(1))"},
            {"[1,2],3", "14( 9(1) 9(2]))"},
    };
    expectAccepted<SerializableMapArray>(kRows);
}

TEST(ArrayReader, SkipsOneCharacterBehindANestedContainer) {
    const Accepted kRows[] = {
            {"[{\"a\":1};2]", "14( 13( a=9(1)) 9(2))"},
            {"[[1]23]", "14( 14( 9(1)) 9(3))"},
            {"[[1],[2],{\"a\":3}]", "14( 14( 9(1)) 14( 9(2)) 13( a=9(3)))"},
            {"[[1]\\\",2]", "14( 14( 9(1)) 12() 9(2))"},
    };
    expectAccepted<SerializableMapArray>(kRows);
}

TEST(ArrayReader, LogsTheReasonOfEachFailureAndLeavesTheTarget) {
    const Refused kRows[] = {
            {"", {"invalid format (should start with a bracket)"}},
            {"1]", {"invalid format (should start with a bracket)"}},
            {"][1", {"invalid format (should end with a bracket)"}},
            {"[{\"a\":1]", {"invalid map data"}},
            {"[[[1]", {"invalid array data"}},
            {"[{}]", {kNoKey, kInKey, "invalid format: unserialize array failed 1"}},
            {"[[{}]]",
             {kNoKey, kInKey, "invalid format: unserialize array failed 1",
              "invalid format: unserialize array failed"}},
            {"[1,{\"a\":{}}]",
             {kNoKey, kInKey, "invalid format: unserialize failed 1",
              "invalid format: unserialize array failed 1"}},
    };
    SerializableMapArray target;
    target.add(1);
    expectRefused(kRows, target);
}

TEST(ArrayReader, StoresANullValueForATokenWithoutAnEndAndGoesOnBehindItsStart) {
    const Unended kRows[] = {
            {"[xy\"]", "14( 0() 0() 0())", 3},
            {"[x\"y]", "14( 0() 0() 9(y))", 2},
    };
    expectUnended<SerializableMapArray>(kRows);
}

TEST(ReaderDeathTest, AnEmptyScalarIsFatal) {
    const char* const kFatal = "token.empty\\(\\)\\|SerializableMap\\|a scalar has no text\n";
    for (const char* text : {"{\"a\": ,\"b\":1}", "{\"a\":,\"b\":1}", "{\"a\":{\"b\":,}}"}) {
        EXPECT_DEATH(SerializableMap().unserialize(text), kFatal) << text;
    }
    for (const char* text : {"[1, ,2]", "[,]", "[{\"a\":1} ,2]", "[[1] ,2]"}) {
        EXPECT_DEATH(SerializableMapArray().unserialize(text), kFatal) << text;
    }
}

TEST(RoundTrip, KeepsTextsButNotTypes) {
    SerializableMap written;
    written.add("int", 3);
    written.add("minus", -3);
    written.add("byte", static_cast<unsigned char>(7));
    written.add("float", -2.5f);
    written.add("bool", true);
    written.add("text", std::string("a,b"));
    written.add("blob", SerializableBlob("ab", 2));
    written.add("null", SerializableValue("null", VALUE_TYPE_BOOL));
    SerializableMap read;
    EXPECT_EQ(read.unserialize(written.serialize()), 0);
    EXPECT_EQ(contentsOf(read),
              "13( blob=9(blob) bool=11(true) byte=9(7) float=5(-2.500000) int=9(3) minus=5(-3) "
              "null=11(null) text=12(a,b))");
    EXPECT_EQ(read.serialize(), written.serialize());
    bool flag = true;
    EXPECT_EQ(read.valueFor("null").getValue(flag), STATUS_INVALID_FORMAT);
    float number = 0;
    EXPECT_EQ(read.valueFor("float").getValue(number), 0);
    EXPECT_EQ(number, -2.5f);
    SerializableBlob blob;
    EXPECT_EQ(read.valueFor("blob").getValue(blob), STATUS_INVALID_FORMAT);
}

TEST(RoundTrip, AnEmptyArrayIsReadBackButAnEmptyMapIsNot) {
    SerializableMapArray array;
    EXPECT_EQ(array.unserialize(SerializableMapArray().serialize()), 0);
    SerializableMap map;
    EXPECT_EQ(map.unserialize(SerializableMap().serialize()), STATUS_INVALID_FORMAT);
}

}  // namespace
}  // namespace pemaro
