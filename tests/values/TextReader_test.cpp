// SPDX-License-Identifier: Apache-2.0
#include "pemaro/TextReader.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "pemaro/SerializableValue.h"
#include "pemaro/Status.h"
#include "pemaro/testkit/LogRecorder.h"

namespace pemaro {
namespace {

using test::LogLine;
using test::LogRecorder;
using testing::ElementsAre;
using testing::IsEmpty;

struct Token {
    const char* token;
    int type;
};

const Token kTokens[] = {
        {"true", VALUE_TYPE_BOOL},    {"false", VALUE_TYPE_BOOL},  {"null", VALUE_TYPE_BOOL},
        {"-3", VALUE_TYPE_UINT32},    {"-", VALUE_TYPE_UINT32},    {"-x", VALUE_TYPE_UINT32},
        {"\"x\"", VALUE_TYPE_STRING}, {"\"\"", VALUE_TYPE_STRING}, {"\"", VALUE_TYPE_STRING},
        {".5", VALUE_TYPE_INT32},     {".", VALUE_TYPE_INT32},     {"..", VALUE_TYPE_INT32},
        {"1.5", VALUE_TYPE_FLOAT},    {"42", VALUE_TYPE_FLOAT},    {"0x1F", VALUE_TYPE_FLOAT},
        {"blob", VALUE_TYPE_FLOAT},   {"True", VALUE_TYPE_FLOAT},  {"\"x", VALUE_TYPE_FLOAT},
        {"x\"", VALUE_TYPE_FLOAT},    {" ", VALUE_TYPE_FLOAT},     {"nullx", VALUE_TYPE_FLOAT},
};

TEST(FindValueType, GoesByTheShapeOfTheToken) {
    for (const Token& row : kTokens) EXPECT_EQ(findValueType(row.token), row.type) << row.token;
}

TEST(FindValueTypeDeathTest, AnEmptyTokenIsFatal) {
    EXPECT_DEATH(findValueType(""), "token.empty\\(\\)\\|SerializableMap\\|a scalar has no text\n");
}

struct Trimmed {
    const char* before;
    const char* after;
};

const Trimmed kTrimmed[] = {
        {"a", "a"},
        {" \t\r\n\v\fa b\f\v\n\r\t ", "a b"},
        {"", ""},
        {" \t ", " \t "},
        {"\b a\xa0", "\b a\xa0"},
};

TEST(RemoveWhitesSpaces, TrimsBothEndsUnlessThereIsNothingElse) {
    for (const Trimmed& row : kTrimmed) {
        std::string text = row.before;
        EXPECT_EQ(removeWhitesSpaces(text), 0);
        EXPECT_EQ(text, row.after);
    }
}

struct Key {
    const char* text;
    const char* key;
    size_t colon;
};

const Key kKeys[] = {
        {"\"a\":1", "a", 3},
        {" , x\"ab\" y : 1", "ab", 11},
        {"\"a:b\":1", "a:b", 5},
        {"\"a\\\"b\":1", "a\\\"b", 6},
        // There is no empty key: its second quote counts as a part of a longer one.
        {"\"\":\"b\":1", "\":", 6},
        {"\"\"\":1", "\"", 3},
};

TEST(FindKey, FindsTheNextKeyAndItsColon) {
    LogRecorder::instance().clear();
    for (const Key& row : kKeys) {
        SCOPED_TRACE(row.text);
        char* colon = nullptr;
        std::string key;
        EXPECT_EQ(findKey(row.text, &colon, key), 0);
        EXPECT_EQ(key, row.key);
        EXPECT_EQ(colon, row.text + row.colon);
    }
    EXPECT_THAT(LogRecorder::instance().lines(), IsEmpty());
}

TEST(FindKey, LogsEachFailure) {
    for (const char* text : {"", "a:1", "\"", "\"a:1", "\"\"", "\"\":1", "\"a\\\":1", "\"a\" 1"}) {
        SCOPED_TRACE(text);
        LogRecorder::instance().clear();
        char* colon = nullptr;
        std::string key = "untouched";
        EXPECT_EQ(findKey(text, &colon, key), STATUS_INVALID_FORMAT);
        EXPECT_EQ(colon, nullptr);
        EXPECT_EQ(key, "untouched");
        EXPECT_THAT(LogRecorder::instance().lines(),
                    ElementsAre(LogLine{6, "SerializableMap",
                                        "invalid format (a colon must follow key in map)"}));
    }
}

}  // namespace
}  // namespace pemaro
