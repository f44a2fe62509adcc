// SPDX-License-Identifier: Apache-2.0
// "zelkctl check" finds nothing wrong with a good service, and each fault of a broken one.

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <string>

#include "tests/driver/CommandRows.h"
#include "tests/driver/DriverSetting.h"

using testing::HasSubstr;
using testing::MatchesRegex;
using testing::Not;

namespace pemaro::test {

namespace {

struct Fault {
    const char* service;
    const char* fault;
    const char* line;
    bool invasive = false;
};

class CheckFinds : public ::testing::TestWithParam<Fault> {};

}  // namespace

TEST(Check, IsPassedByTheSimulatedStack) {
    for (const Words& words : {Words{"check"}, Words{"check", "--invasive"}}) {
        TouchStack touchStack;
        const RunResult check = zelkctl(words);
        EXPECT_EQ(0, check.status) << check.output;
        EXPECT_EQ("", check.errors);
        EXPECT_THAT(check.output, Not(HasSubstr("FAILED")));
        for (const char* service :
             {"pemaro.TouchService\n", "pemaro.TouchManagerService\n",
              "pemaro.GestureManagerService\n", "pemaro.HandBiometricManagerService\n"}) {
            EXPECT_THAT(check.output, HasSubstr(service));
        }
        for (const char* line : {"  passed   keeps `write - read` within the ring\n",
                                 "  passed   signals the condition after a frame\n"}) {
            EXPECT_EQ(words.size() == 2, check.output.find(line) != std::string::npos) << line;
        }
        EXPECT_EQ(words.size() == 1, check.output.find("see --invasive") != std::string::npos)
                << check.output;
    }
}

TEST(Check, IsPassedByTheExampleServices) {
    const struct {
        const char* program;
        const char* service;
    } rows[] = {{"companion_service", "companion"}, {"gesture_service", "gesture"}};
    for (const auto& row : rows) {
        ChildProcess service({binary(row.program)});
        RunResult check = zelkctl({"check", row.service, "--invasive"});
        for (int i = 0; i < 50 && check.errors.find("not running") != std::string::npos; ++i) {
            check = zelkctl({"check", row.service, "--invasive"});
        }
        EXPECT_EQ(0, check.status) << check.output << check.errors;
    }
}

TEST(Check, SeesTheEventsOfASubscription) {
    TouchStack touchStack({"--gesture-rate", "40"});
    ASSERT_EQ(0, zelkctl({"touch", "enable", "2"}).status);
    const RunResult check = zelkctl({"check", "touch"});
    EXPECT_EQ(0, check.status) << check.output;
    EXPECT_THAT(check.output, HasSubstr("  passed   reports events with a whole record\n"));
    EXPECT_THAT(check.output, Not(HasSubstr("pemaro.TouchService\n")));
}

// A recording would be taken from a client that has one, and its settings changed.
TEST(Check, LeavesTheRecordingsOfOthersAlone) {
    TouchStack touchStack({"--services", "companion"});
    const RunResult check = zelkctl({"check"});
    EXPECT_EQ(0, check.status) << check.output << check.errors;
    EXPECT_THAT(check.output,
                HasSubstr("  skipped  records to shared memory: it may take the recording of "
                          "another client; see --invasive\n"));
    EXPECT_EQ("", touchStack.process().errors());
    EXPECT_THAT(touchStack.process().output(), Not(HasSubstr("client ")));
    EXPECT_EQ(0, zelkctl({"check", "--invasive"}).status);
    EXPECT_TRUE(touchStack.process().awaitOutput("client "));
}

TEST(Check, GivesEachCallTheTimeThatACallMayTake) {
    const Words words = {"check", "companion", "--invasive", "--timeout", "1.2"};
    {
        // The frames that it wants to see alone take longer.
        TouchStack touchStack({"--rate", "30"});
        const RunResult check = zelkctl(words);
        EXPECT_EQ(0, check.status) << check.output << check.errors;
        EXPECT_EQ("", check.errors);
    }
    TouchStack touchStack({"--fault", "inspect=delay:5000ms"});
    const RunResult check = zelkctl(words);
    EXPECT_EQ(4, check.status);
    EXPECT_EQ("zelkctl: check of companion: code 23: no answer within 1.2 s\n", check.errors);
}

TEST(Check, SpeaksJsonAndTap) {
    TouchStack touchStack({"--services", "hand"});
    const std::vector<std::string> json = splitLines(zelkctl({"check", "--json"}).output);
    ASSERT_GE(json.size(), 10u);
    EXPECT_EQ(
            "{\"service\":\"pemaro.HandBiometricManagerService\",\"check\":\"answers a ping\","
            "\"outcome\":\"passed\"}",
            json[0]);
    EXPECT_THAT(json.back(),
                MatchesRegex("\\{\"passed\":[0-9]+,\"failed\":0,\"skipped\":[0-9]+\\}"));

    const std::vector<std::string> tap = splitLines(zelkctl({"check", "hand", "--tap"}).output);
    EXPECT_EQ("TAP version 13", tap.front());
    EXPECT_EQ("ok 1 - pemaro.HandBiometricManagerService: answers a ping", tap[1]);
    EXPECT_EQ("1.." + std::to_string(json.size() - 1), tap.back());
}

TEST(Check, TellsWhatIsNotThere) {
    expectRows(
            {{{"check"}, 3, "none of the services is running\n"},
             {{"check", "touch"}, 3, "the service pemaro.TouchManagerService is not running\n"}});
}

TEST_P(CheckFinds, TheFault) {
    ChildProcess service({binary("broken-service"), GetParam().service, GetParam().fault});
    ASSERT_TRUE(service.awaitOutput("process ")) << service.errors();
    Words words = {"check", GetParam().service};
    if (GetParam().invasive) {
        words.emplace_back("--invasive");
    }
    const RunResult check = zelkctl(words);
    EXPECT_EQ(1, check.status);
    EXPECT_THAT(check.output, HasSubstr("  FAILED   " + std::string(GetParam().line)));
}

TEST(Check, FindsNothingWhereThereIsNoFault) {
    for (const char* kind : {"companion", "touch"}) {
        for (const char* fault : {"none", "offers-nothing"}) {
            ChildProcess service({binary("broken-service"), kind, fault});
            ASSERT_TRUE(service.awaitOutput("process ")) << service.errors();
            const RunResult check = zelkctl({"check", kind, "--invasive"});
            EXPECT_EQ(0, check.status) << check.output;
        }
    }
}

INSTANTIATE_TEST_SUITE_P(
        All, CheckFinds,
        ::testing::Values(
                Fault{"companion", "any-token",
                      "refuses a request without a token before it looks at its code: code "},
                Fault{"companion", "code-before-token",
                      "refuses another interface's token before it looks at the code: code 29 with "
                      "another interface's as a token ended with -74 instead of -1\n"},
                Fault{"companion", "any-code",
                      "does not know codes that there are not: code 29 ended with 0 instead of "
                      "-74\n"},
                Fault{"companion", "no-descriptor",
                      "tells its descriptor: result 0, 'something.else'\n"},
                Fault{"companion", "short-reply",
                      "the reply of inspect is as it should be: the reply ends too early\n"},
                Fault{"companion", "long-reply",
                      "the reply of inspect is as it should be: 4 bytes too many in the reply\n"},
                Fault{"companion", "unknown-status",
                      "the reply of inspect is as it should be: 5 is no known status\n"},
                Fault{"companion", "unreadable-map",
                      "the reply of getProperties is as it should be: a map that cannot be read\n"},
                Fault{"companion", "no-packet-size",
                      "the reply of getPacketSize is as it should be: 0 is no size of a packet\n"},
                Fault{"companion", "negative-length",
                      "refuses to fill a buffer of negative length: a length of -1 was answered "
                      "with "
                      "4 bytes\n"},
                Fault{"companion", "dies-of-a-length", "takes a text of an impossible length"},
                Fault{"companion", "ring-too-large",
                      "shares a control block with a ring that fits: a ring of 16 frames of 4096 "
                      "bytes "
                      "does not fit in ",
                      true},
                Fault{"companion", "indices-ahead",
                      "shares a control block with a ring that fits: the indices begin at 0 and "
                      "3\n",
                      true},
                Fault{"companion", "overruns", "keeps `write - read` within the ring: ", true},
                Fault{"companion", "no-signal",
                      "signals the condition after a frame: frames came, and no signal\n", true},
                Fault{"companion", "bad-frame-length",
                      "gives each frame a length that fits its slot: frame 0 tells a length of "
                      "4097, in "
                      "slots of 4096\n",
                      true},
                Fault{"companion", "goes-on", "writes no more once it was stopped: ", true},
                Fault{"companion", "hangs", "answers in time: no answer for 10 s"},
                Fault{"touch", "unsure-answer",
                      "the reply of isSupported is as it should be: 2 is no answer\n"},
                Fault{"touch", "keeps-subscriptions",
                      "lets a subscription end: the service said: Invalid state\n"},
                Fault{"touch", "reports-for-ever", "reports nothing after that: "},
                Fault{"touch", "cuts-records-short", "reports events with a whole record: "}),
        [](const auto& info) {
            std::string name = info.param.fault;
            for (char& character : name) {
                character = character == '-' ? '_' : character;
            }
            return name;
        });

}  // namespace pemaro::test
