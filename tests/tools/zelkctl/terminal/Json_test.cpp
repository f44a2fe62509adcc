// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/terminal/Json.h"

#include <gtest/gtest.h>

#include <string>

namespace pemaro::zelkctl {

TEST(JsonObject, HasItsMembersInTheOrderGiven) {
    EXPECT_EQ("{}", JsonObject().text());
    EXPECT_EQ("{\"session\":3,\"gain\":\"1.5\",\"low\":-7,\"word\":4294967295}",
              JsonObject()
                      .add("session", 3)
                      .add("gain", "1.5")
                      .add("low", -7)
                      .add("word", 4294967295u)
                      .text());
}

TEST(JsonObject, QuotesTexts) {
    using namespace std::string_literals;
    const struct {
        std::string text;
        const char* quoted;
    } rows[] = {
            {"a\"b\\c", R"("a\"b\\c")"},
            {"two\nlines\t", R"("two\nlines\t")"},
            {"\x1b[0m"s, R"("\u001B[0m")"},
            {"a\0b"s, R"("a\u0000b")"},
            {"\xC3\xA4\xE2\x82\xAC\xF0\x9F\x91\x86", "\"\xC3\xA4\xE2\x82\xAC\xF0\x9F\x91\x86\""},
            // Bytes that are no UTF-8: a stray one, one cut off, an overlong form.
            {"a\xFFz", "\"a\xEF\xBF\xBDz\""},
            {"a\xE2\x82", "\"a\xEF\xBF\xBD\xEF\xBF\xBD\""},
            {"\xC0\xAF", "\"\xEF\xBF\xBD\xEF\xBF\xBD\""},
    };
    for (const auto& row : rows) {
        EXPECT_EQ("{\"x\":" + std::string(row.quoted) + "}",
                  JsonObject().add("x", row.text).text());
    }
}

TEST(JsonObject, QuotesNames) {
    EXPECT_EQ("{\"a\\\"b\":1}", JsonObject().add("a\"b", 1).text());
}

TEST(JsonObject, TakesATextThatIsJsonAsWhatItIs) {
    using namespace std::string_literals;
    const struct {
        std::string text;
        const char* member;
    } rows[] = {
            {"51", "51"},
            {"-2.5e3", "-2.5e3"},
            {"\"a\"", "\"a\""},
            {"{\"a\":[1,null]}", "{\"a\":[1,null]}"},
            {" [1,\r\n 2]\n", " [1,   2] "},
            // No JSON: a text.
            {"", "\"\""},
            {"5 1", "\"5 1\""},
            {"{a:1}", "\"{a:1}\""},
            {"51\0"s, "\"51\\u0000\""},
            {"51\0\"rest"s, "\"51\\u0000\\\"rest\""},
            {"\0"s, "\"\\u0000\""},
    };
    for (const auto& row : rows) {
        EXPECT_EQ("{\"x\":" + std::string(row.member) + "}",
                  JsonObject().addParsed("x", row.text).text());
    }
}

TEST(JsonObject, WritesFlagsAndTimes) {
    const std::chrono::system_clock::time_point when{std::chrono::milliseconds(1795202045067)};
    EXPECT_EQ("{\"on\":true,\"off\":false,\"time\":1795202045.067}",
              JsonObject().addFlag("on", true).addFlag("off", false).addTime("time", when).text());
}

TEST(JsonObject, HoldsRealNumbers) {
    EXPECT_EQ("{\"a\":1.5,\"b\":4.166667,\"c\":0.0,\"d\":-240.0}", JsonObject()
                                                                           .addReal("a", 1.5)
                                                                           .addReal("b", 25.0 / 6)
                                                                           .addReal("c", 1e-9)
                                                                           .addReal("d", -240)
                                                                           .text());
}

TEST(JsonObject, HoldsObjectsAndArrays) {
    EXPECT_EQ("{\"o\":{\"a\":1},\"l\":[{\"b\":2}],\"n\":[1,-2],\"e\":[]}",
              JsonObject()
                      .add("o", JsonObject().add("a", 1))
                      .add("l", JsonArray().add(JsonObject().add("b", 2)))
                      .add("n", std::vector<int64_t>{1, -2})
                      .add("e", std::vector<int64_t>{})
                      .text());
}

TEST(JsonArray, HoldsObjectsInTheirOrder) {
    EXPECT_EQ("[]", JsonArray().text());
    EXPECT_EQ("[{\"a\":1},{\"b\":2}]",
              JsonArray().add(JsonObject().add("a", 1)).add(JsonObject().add("b", 2)).text());
}

}  // namespace pemaro::zelkctl
