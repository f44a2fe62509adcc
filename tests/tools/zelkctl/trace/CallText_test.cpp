// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/trace/CallText.h"

#include <gtest/gtest.h>

#include <chrono>
#include <string>

#include "tests/tools/zelkctl/trace/SomeCall.h"

namespace pemaro::zelkctl {

namespace {

constexpr std::chrono::system_clock::time_point kWhen{std::chrono::milliseconds(1'700'000'000'123)};

// A line without the time of day, which depends on where the test runs.
std::string lineOf(const TracedCall& call, const Party& caller = someCaller()) {
    return callLine(call, kWhen, caller, someCallee()).substr(14);
}

}  // namespace

TEST(CallText, NamesOperationsAndWhatAllObjectsCanBeAsked) {
    const struct {
        const char* service;
        uint32_t code;
        const char* name;
    } rows[] = {{"companion", 1, "companion.registerClient"},
                {"companion", 24, "companion.getConfigParams (map)"},
                {"companion", 28, "companion.setAuth"},
                {"companion", 29, "companion.code 29"},
                {"touch", 0, "touch.code 0"},
                {"gesture", 13, "gesture.getMaxUserDefinedGesture"},
                {"hand", 16, "hand.disableWakeup"},
                {"hand", 0x5F504E47, "hand.ping"},
                {"hand", 0x5F4E5446, "hand.descriptor"},
                {"hand", 0x5F444D50, "hand.dump"}};
    for (const auto& row : rows) {
        TracedCall call = someCall();
        call.interface = &knownService(row.service);
        call.code = row.code;
        EXPECT_EQ(row.name, callName(call));
    }
}

TEST(CallText, IsALineForPeople) {
    EXPECT_EQ("zelkctl 146 > zelk-touchstack 137  touch.isSupported  56 > 8 bytes  0.500 ms",
              lineOf(someCall()));
    const struct {
        CallEnd end;
        const char* rest;
    } rows[] = {
            {CallEnd::kRefused, "  0.500 ms  FAILED: answered by an error in place of a reply"},
            {CallEnd::kDead, "  0.500 ms  FAILED: the process that was called ended"},
            {CallEnd::kUndelivered, "  0.500 ms  FAILED: the driver could not deliver it"},
    };
    for (const auto& row : rows) {
        TracedCall call = someCall();
        call.end = row.end;
        EXPECT_EQ(std::string("zelkctl 146 > zelk-touchstack 137  touch.isSupported  56 bytes") +
                          row.rest,
                  lineOf(call));
    }
    EXPECT_EQ(
            "? (thread 147) > zelk-touchstack 137  touch.isSupported  56 bytes  no answer was "
            "seen",
            lineOf(openCall(), {0, 147, "?"}));
}

TEST(CallText, IsAnObjectForPrograms) {
    EXPECT_EQ(R"({"time":1700000000.123,"service":"touch",)"
              R"("interface":"pemaro.TouchManagerService","operation":"isSupported","code":3,)"
              R"("from":{"name":"zelkctl","process":146,"thread":147},)"
              R"("to":{"name":"zelk-touchstack","process":137,"thread":143},)"
              R"("outcome":"answered","request":56,"reply":8,"seconds":0.0005,"serving":0.0002})",
              callJson(someCall(), kWhen, someCaller(), someCallee()));
    EXPECT_EQ(R"({"time":1700000000.123,"service":"touch",)"
              R"("interface":"pemaro.TouchManagerService","operation":"isSupported","code":3,)"
              R"("from":{"name":"?","thread":147},)"
              R"("to":{"name":"zelk-touchstack","process":137},)"
              R"("outcome":"open","request":56})",
              callJson(openCall(), kWhen, {0, 147, "?"}, {137, 0, "zelk-touchstack"}));
}

}  // namespace pemaro::zelkctl
