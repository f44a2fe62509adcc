// SPDX-License-Identifier: Apache-2.0

// A mebibyte of anything, on a thread with little stack. The bounds on time are generous; what they
// tell apart is linear from quadratic, which would take minutes. They are bounds on the processor's
// time, which no other program on the machine takes away.

#include <gtest/gtest.h>
#include <pthread.h>

#include <ctime>
#include <functional>

#include "pemaro/SerializableMap.h"
#include "pemaro/SerializableMapArray.h"
#include "pemaro/Status.h"
#include "pemaro/testkit/LogRecorder.h"
#include "tests/support/Sanitizers.h"

namespace pemaro {
namespace {

using test::LogRecorder;

// A mebibyte. A sanitizer finds in less what it finds in that: the stack has at most 12 bytes for
// each of a text's containers.
constexpr size_t kTextBytes = test::kSanitized ? 1 << 17 : 1 << 20;
constexpr size_t kStackBytes = 256 * 1024;
constexpr double kLinearSeconds = 60;

/// Runs `body` on a thread with a small stack.
void onSmallStack(std::function<void()> body) {
    pthread_attr_t attributes;
    ASSERT_EQ(pthread_attr_init(&attributes), 0);
    ASSERT_EQ(pthread_attr_setstacksize(&attributes, kStackBytes), 0);
    pthread_t thread;
    const auto run = [](void* argument) -> void* {
        (*static_cast<std::function<void()>*>(argument))();
        return nullptr;
    };
    const std::clock_t start = std::clock();
    ASSERT_EQ(pthread_create(&thread, &attributes, run, &body), 0);
    ASSERT_EQ(pthread_join(thread, nullptr), 0);
    EXPECT_LT(static_cast<double>(std::clock() - start) / CLOCKS_PER_SEC, kLinearSeconds);
    ASSERT_EQ(pthread_attr_destroy(&attributes), 0);
}

std::string repeat(const std::string& piece, size_t times) {
    std::string text;
    text.reserve(piece.size() * times);
    for (size_t i = 0; i < times; ++i) text += piece;
    return text;
}

/// `count` containers, one in the other, around `core`.
std::string nested(const std::string& open, const std::string& core, const std::string& close,
                   size_t count) {
    return repeat(open, count) + core + repeat(close, count);
}

/// Does everything with what was read that can be done with a map.
void useMap(SerializableMap& map, const std::string& text) {
    EXPECT_TRUE(map.serialize() == text);
    SerializableMap copy(map);
    SerializableMap assigned;
    assigned.add("old", map);
    assigned = copy;
    copy.editValueFor("a").getValue<SerializableMap>().add("b", map);
    EXPECT_TRUE(assigned.serialize() == text);
    SerializableMap sum = assigned + copy;
    sum += copy;
    EXPECT_TRUE(sum.serialize() == copy.serialize());
    SerializableMap got;
    EXPECT_EQ(SerializableValue(map).getValue(got), 0);
    EXPECT_TRUE(got.serialize() == text);
    EXPECT_EQ(sum.clear(), 0);
    got.removeItem("a");
    EXPECT_EQ(got.size(), 0u);
}

TEST(DeepNesting, MapsAreReadWrittenCopiedMergedAndDestroyed) {
    const std::string text = nested("{\"a\":", "{\"a\":1}", "}", kTextBytes / 6);
    onSmallStack([&text] {
        SerializableMap map;
        EXPECT_EQ(map.unserialize(text), 0);
        useMap(map, text);
    });
}

TEST(DeepNesting, ArraysAreReadWrittenCopiedAndDestroyed) {
    const std::string text = nested("[", "", "]", kTextBytes / 2);
    onSmallStack([&text] {
        SerializableMapArray array;
        EXPECT_EQ(array.unserialize(text), 0);
        EXPECT_TRUE(array.serialize() == text);
        SerializableMapArray copy(array);
        SerializableMapArray assigned;
        assigned = copy;
        copy.get(0).getValue<SerializableMapArray>().add(SerializableValue(assigned));
        EXPECT_EQ(copy.set(0, 1), 0);
        EXPECT_TRUE(assigned.serialize() == text);
        SerializableMapArray got;
        EXPECT_EQ(SerializableValue(array).getValue(got), 0);
        EXPECT_TRUE(got.serialize() == text);
        got.clear();
    });
}

TEST(DeepNesting, MapsAndArraysMayAlternate) {
    const std::string text = nested("{\"a\":[", "{\"a\":1}", "]}", kTextBytes / 8);
    onSmallStack([&text] {
        SerializableMap map;
        EXPECT_EQ(map.unserialize(text), 0);
        const SerializableMap copy(map);
        EXPECT_TRUE(copy.serialize() == text);
    });
}

TEST(DeepNesting, UnclosedContainersAreRefused) {
    const std::string maps = repeat("{\"a\":", kTextBytes / 5);
    const std::string arrays(kTextBytes, '[');
    onSmallStack([&] {
        SerializableMap map;
        EXPECT_EQ(map.unserialize(maps), STATUS_INVALID_FORMAT);
        EXPECT_EQ(map.unserialize(maps + "}"), STATUS_INVALID_FORMAT);
        EXPECT_EQ(map.unserialize("{\"a\":" + arrays + "}"), STATUS_INVALID_FORMAT);
        SerializableMapArray array;
        EXPECT_EQ(array.unserialize(arrays), STATUS_INVALID_FORMAT);
        EXPECT_EQ(array.unserialize(arrays + "]"), STATUS_INVALID_FORMAT);
        EXPECT_EQ(array.unserialize("[" + maps + "]"), STATUS_INVALID_FORMAT);
    });
}

TEST(DeepNesting, AFailureInTheInnermostTakesAllAlong) {
    constexpr size_t kDepth = kTextBytes / 6;
    const std::string text = nested("{\"a\":", "{}", "}", kDepth);
    onSmallStack([&text] {
        LogRecorder::instance().clear();
        SerializableMap map;
        EXPECT_EQ(map.unserialize(text), STATUS_INVALID_FORMAT);
        // The innermost logs two lines of its own, each map around it one.
        EXPECT_EQ(LogRecorder::instance().lines().size(), 2 + kDepth);
    });
}

TEST(LongTexts, ManyEntriesAreRead) {
    std::string text = "{\"k0\":0";
    for (int i = 1; text.size() < kTextBytes; ++i) {
        // A third of the keys comes in ascending order, the others do not.
        const std::string key = std::to_string(i % 3 == 0 ? i : 1000000 - i);
        text += ",\"k" + key + "\":" + std::to_string(i);
    }
    text += "}";
    onSmallStack([&text] {
        SerializableMap map;
        EXPECT_EQ(map.unserialize(text), 0);
        SerializableMap again;
        EXPECT_EQ(again.unserialize(map.serialize()), 0);
        EXPECT_EQ(again.size(), map.size());
        EXPECT_TRUE(again.serialize() == map.serialize());
        again += map;
        EXPECT_TRUE(again.serialize() == map.serialize());
    });
}

struct Hostile {
    const char* name;
    std::string text;
};

// Texts in which a search has a long way to go from each of many places.
TEST(LongTexts, HostileTextsTakeLinearTime) {
    constexpr size_t k = kTextBytes / 16;
    const Hostile kHostile[] = {
            {"no comma", "[" + std::string(kTextBytes, 'x') + "]"},
            {"no end of any token", "[" + std::string(kTextBytes, 'x') + "\"]"},
            {"no end, in either reading",
             "[" + repeat("x\\\"", k) + "\"" + repeat("y", k) + "\"]\""},
            {"odd quotes", "[" + repeat("\"a ", k) + "\"]"},
            {"one unescaped quote each", "[" + repeat("[\"]", k) + "]"},
            {"no comma between nested", "[" + repeat("[1] ", k) + "]"},
            {"brackets in the other reading", "[\"" + repeat("[", k) + "\"" + repeat("]", k) + "]"},
            {"unbalanced inside", "[" + repeat("[}{]", k) + "]"},
            {"open strings in nested", "[" + nested("[", "x\"", "]", k) + "]"},
            {"keys without values", "{" + repeat("\"a\":x", k) + "\"}"},
            {"one long key", "{\"" + std::string(kTextBytes, 'k') + "\":1}"},
            {"escaped quotes", "{\"" + repeat("\\\"", k) + "\":1}"},
            {"white space", "{" + repeat(" ", k) + "\"a\"" + repeat(" ", k) + ":" + repeat(" ", k) +
                                    "1" + repeat(" ", k) + "}" + repeat(" ", k)},
            {"equal keys", "{" + repeat("\"a\":{\"b\":1},", k) + "\"a\":2}"},
            {"commas behind the end", "[1]" + std::string(kTextBytes, ',')},
            {"no commas behind the end", "{\"a\":1}" + std::string(kTextBytes, 'x')},
    };
    for (const Hostile& hostile : kHostile) {
        SCOPED_TRACE(hostile.name);
        onSmallStack([&hostile] {
            LogRecorder::instance().clear();
            if (hostile.text.front() == '{') {
                SerializableMap().unserialize(hostile.text);
            } else {
                SerializableMapArray().unserialize(hostile.text);
            }
        });
    }
    LogRecorder::instance().clear();
}

}  // namespace
}  // namespace pemaro
