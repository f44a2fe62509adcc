// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/trace/Timeline.h"

#include <gtest/gtest.h>
#include <rapidjson/document.h>

#include <string>

#include "tests/tools/zelkctl/trace/SomeCall.h"

namespace pemaro::zelkctl {

namespace {

// The events of a file; the test fails when it is none.
rapidjson::Document eventsOf(const std::string& file) {
    rapidjson::Document document;
    document.Parse(file.c_str());
    EXPECT_FALSE(document.HasParseError()) << file;
    EXPECT_TRUE(document.IsObject() && document["traceEvents"].IsArray()) << file;
    rapidjson::Document events;
    events.CopyFrom(document["traceEvents"], events.GetAllocator());
    return events;
}

}  // namespace

TEST(Timeline, IsAFileWithoutACall) {
    Timeline timeline;
    EXPECT_EQ("{\"displayTimeUnit\":\"ms\",\"traceEvents\":[\n]}\n", timeline.end());
}

TEST(Timeline, ShowsACallOnBothThreadsWithAnArrow) {
    Timeline timeline;
    std::string file = timeline.add(someCall(), someCaller(), someCallee());
    file += timeline.end();
    const rapidjson::Document events = eventsOf(file);
    ASSERT_EQ(6u, events.Size());

    const auto& callerName = events[0];
    EXPECT_STREQ("M", callerName["ph"].GetString());
    EXPECT_STREQ("process_name", callerName["name"].GetString());
    EXPECT_EQ(146, callerName["pid"].GetInt());
    EXPECT_STREQ("zelkctl", callerName["args"]["name"].GetString());
    EXPECT_STREQ("zelk-touchstack", events[1]["args"]["name"].GetString());

    const auto& waits = events[2];
    EXPECT_STREQ("X", waits["ph"].GetString());
    EXPECT_STREQ("touch.isSupported", waits["name"].GetString());
    EXPECT_EQ(146, waits["pid"].GetInt());
    EXPECT_EQ(147, waits["tid"].GetInt());
    EXPECT_EQ(1'100'000.0, waits["ts"].GetDouble());
    EXPECT_EQ(500.0, waits["dur"].GetDouble());
    EXPECT_STREQ("pemaro.TouchManagerService", waits["args"]["interface"].GetString());
    EXPECT_EQ(3, waits["args"]["code"].GetInt());
    EXPECT_STREQ("answered", waits["args"]["outcome"].GetString());
    EXPECT_EQ(56, waits["args"]["request"].GetInt());
    EXPECT_EQ(8, waits["args"]["reply"].GetInt());
    EXPECT_EQ(53, waits["args"]["transaction"].GetInt());

    const auto& works = events[3];
    EXPECT_STREQ("X", works["ph"].GetString());
    EXPECT_EQ(137, works["pid"].GetInt());
    EXPECT_EQ(143, works["tid"].GetInt());
    EXPECT_EQ(1'100'100.0, works["ts"].GetDouble());
    EXPECT_EQ(200.0, works["dur"].GetDouble());

    const auto& tail = events[4];
    const auto& head = events[5];
    EXPECT_STREQ("s", tail["ph"].GetString());
    EXPECT_EQ(waits["ts"], tail["ts"]);
    EXPECT_EQ(waits["tid"], tail["tid"]);
    EXPECT_STREQ("f", head["ph"].GetString());
    EXPECT_STREQ("e", head["bp"].GetString());
    EXPECT_EQ(works["ts"], head["ts"]);
    EXPECT_EQ(works["tid"], head["tid"]);
    for (const char* name : {"id", "cat", "name"}) {
        EXPECT_EQ(tail[name], head[name]) << name;
    }
}

TEST(Timeline, NamesAProcessOnceAndShowsWhatIsKnown) {
    Timeline timeline;
    std::string file = timeline.add(someCall(), someCaller(), someCallee());
    file += timeline.add(openCall(), {0, 147, "?"}, {137, 0, "zelk-touchstack"});
    TracedCall dead = someCall();
    dead.end = CallEnd::kDead;
    dead.replied = 0;
    file += timeline.add(dead, someCaller(), someCallee());
    file += timeline.end();
    const rapidjson::Document events = eventsOf(file);
    ASSERT_EQ(6u + 2u + 4u, events.Size());
    // A thread of an unknown process stands alone, and waited for nothing that was seen.
    EXPECT_STREQ("M", events[6]["ph"].GetString());
    EXPECT_EQ(147, events[6]["pid"].GetInt());
    EXPECT_EQ(0.0, events[7]["dur"].GetDouble());
    // The service worked until it was known to be dead.
    EXPECT_EQ(400.0, events[9]["dur"].GetDouble());
    EXPECT_STREQ("dead", events[9]["args"]["outcome"].GetString());
}

}  // namespace pemaro::zelkctl
