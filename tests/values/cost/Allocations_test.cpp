// SPDX-License-Identifier: Apache-2.0

// How often and how much the values allocate. What has to be is counted from the tree itself; the
// margins are for work lists, whose first records need no allocation.

#include <gtest/gtest.h>

#include "bench/Payloads.h"
#include "pemaro/SerializableMap.h"
#include "pemaro/SerializableMapArray.h"
#include "tests/support/MapText.h"
#include "tests/values/cost/AllocationCounter.h"
#include "values/ValueAccess.h"

namespace pemaro {
namespace {

using A = ValueAccess;
using test::Allocations;
using test::mapOf;
using test::startCounting;
using test::stopCounting;

/// Work lists that double while they are small, and the sorting of keys.
constexpr size_t kWork = 24;

size_t blocksOf(const std::string& text) {
    return text.size() > std::string().capacity() ? 1 : 0;
}

size_t blocksOf(const SerializableMap& map);

/// The allocations that a container's values have to take: one for a text that does not fit into the
/// string, two for a container with its storage.
size_t blocksOf(const SerializableMapArray& array) {
    size_t blocks = 0;
    for (size_t i = 0; i < A::size(array); ++i) {
        const SerializableValue& value = array.get(i);
        blocks += blocksOf(A::text(value));
        if (A::map(value) != nullptr) blocks += 1 + blocksOf(*A::map(value));
        if (A::array(value) != nullptr) blocks += 1 + blocksOf(*A::array(value));
    }
    return blocks + (A::size(array) == 0 ? 0 : 1);
}

size_t blocksOf(const SerializableMap& map) {
    size_t blocks = 0;
    for (size_t i = 0; i < A::size(map); ++i) {
        const SerializableValue& value = A::entries(map).valueAt(i);
        blocks += blocksOf(A::entries(map).keyAt(i)) + blocksOf(A::text(value));
        if (A::map(value) != nullptr) blocks += 1 + blocksOf(*A::map(value));
        if (A::array(value) != nullptr) blocks += 1 + blocksOf(*A::array(value));
    }
    return blocks + (A::size(map) == 0 ? 0 : 1);
}

class PayloadAllocations : public testing::TestWithParam<bench::Payload> {};

TEST_P(PayloadAllocations, ReadingTakesThoseOfTheTree) {
    const std::string& text = GetParam().text;
    SerializableMap map;
    startCounting();
    const int status = map.unserialize(text);
    const Allocations allocations = stopCounting();
    EXPECT_EQ(status, 0);
    EXPECT_LE(allocations.count, blocksOf(map) + kWork);
    EXPECT_LE(allocations.peakBytes, allocations.heldBytes * 3 / 2 + 1024);
}

TEST_P(PayloadAllocations, CopyingTakesThoseOfTheTree) {
    const SerializableMap map = mapOf(GetParam().text);
    startCounting();
    const SerializableMap copy(map);
    const Allocations allocations = stopCounting();
    EXPECT_LE(allocations.count, blocksOf(copy) + kWork);
    EXPECT_LE(allocations.peakBytes, allocations.heldBytes * 3 / 2 + 1024);
}

TEST_P(PayloadAllocations, WritingTakesThoseOfAGrowingText) {
    const SerializableMap map = mapOf(GetParam().text);
    startCounting();
    const std::string text = map.serialize();
    const Allocations allocations = stopCounting();
    EXPECT_EQ(text.size(), GetParam().text.size());
    EXPECT_LE(allocations.count, kWork);
}

INSTANTIATE_TEST_SUITE_P(Payloads, PayloadAllocations, testing::ValuesIn(bench::payloads()),
                         [](const auto& info) { return info.param.name; });

class ShapeAllocations : public testing::TestWithParam<bench::Shape> {};

TEST_P(ShapeAllocations, ReadingPeaksAtOneAndAHalfOfWhatIsHeld) {
    constexpr size_t kSize = 100000;
    const std::string text = GetParam().text(kSize);
    SerializableMap map;
    SerializableMapArray array;
    startCounting();
    const int status = GetParam().ofArray ? array.unserialize(text) : map.unserialize(text);
    const Allocations allocations = stopCounting();
    if (status == 0 && allocations.heldBytes > text.size()) {
        EXPECT_LE(allocations.peakBytes, allocations.heldBytes * 3 / 2 + 8192);
    } else {
        // Of a text that is refused or has one key over and over, the work lists are all there is.
        EXPECT_LE(allocations.peakBytes, 20 * text.size());
    }
}

INSTANTIATE_TEST_SUITE_P(Shapes, ShapeAllocations, testing::ValuesIn(bench::shapes()),
                         [](const auto& info) { return info.param.name; });

TEST(LookUpAllocations, ThereAreNone) {
    SerializableMap map = mapOf(bench::payload("flat").text);
    const std::string present = "touch_parameter_00500";
    const std::string absent = "touch_parameter_00500_and_more";
    startCounting();
    const bool found = map.contains(present) && map.contains(present.c_str());
    const bool missed = map.contains(absent) || map.contains(absent.c_str());
    const int type = map.getType(present);
    const int nullType = map.getType(absent);
    const Allocations allocations = stopCounting();
    EXPECT_TRUE(found);
    EXPECT_FALSE(missed);
    EXPECT_EQ(type, VALUE_TYPE_FLOAT);
    EXPECT_EQ(nullType, VALUE_TYPE_NULL);
    EXPECT_EQ(allocations.count, 0u);
}

TEST(MergeAllocations, AreThoseOfTheCopiesMergedInAndOfOneStorage) {
    const SerializableMap other = mapOf(bench::payload("flat").text);
    SerializableMap map = mapOf(bench::payload("short").text);
    startCounting();
    map += other;
    Allocations allocations = stopCounting();
    EXPECT_EQ(map.size(), 2000u);
    EXPECT_LE(allocations.count, blocksOf(other) + 1 + kWork);

    startCounting();
    map += other;
    allocations = stopCounting();
    EXPECT_EQ(map.size(), 2000u);
    EXPECT_LE(allocations.count, blocksOf(other) + kWork);
}

}  // namespace
}  // namespace pemaro
