// SPDX-License-Identifier: Apache-2.0
// zelkctl's commands for the managers against the simulated ones: what they print and return.

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <signal.h>

#include <chrono>
#include <memory>
#include <string>
#include <thread>
#include <vector>

#include "tests/driver/CommandRows.h"
#include "tests/driver/DriverSetting.h"
#include "tests/support/Terminal.h"

using testing::HasSubstr;
using testing::MatchesRegex;
using testing::Not;

namespace pemaro::test {

namespace {

constexpr size_t kGestureBytes = 72144;
constexpr size_t kHandBytes = 10016;

Words stackOptions(const std::string& service) {
    return {"--services", service, "--gesture-rate", "50", "--hand-rate", "50"};
}

}  // namespace

TEST(ManagerCommands, OfTheTouchManager) {
    TouchStack stack(stackOptions("touch"));
    expectRows({
            {{"touch", "features"},
             0,
             "         1  disabled\n         2  disabled\n         3  disabled\n         4  "
             "disabled\n"},
            {{"touch", "enable", "3"}, 0, "feature 3 enabled\n"},
            {{"touch", "features", "--first", "3", "--last", "4", "--json"},
             0,
             "{\"feature\":3,\"enabled\":true}\n{\"feature\":4,\"enabled\":false}\n"},
            {{"touch", "disable", "3"}, 0, "feature 3 disabled\n"},
            {{"touch", "features", "--first", "7", "--last", "8"},
             0,
             "no feature from 7 to 8 is supported\n"},
            {{"touch", "features", "--first", "7", "--last", "8", "--json"}, 0, ""},
            {{"touch", "enable", "5"},
             1,
             "enable: Action/command is unsupported (0x4000000E): feature 5\n"},
            {{"touch", "disable", "-1"},
             1,
             "disable: Action/command is unsupported (0x4000000E): feature -1\n"},
            {{"touch", "region", "-1", "2", "300", "400"}, 0, "region -1,2 to 300,400 on\n"},
            {{"touch", "region", "0", "0", "3", "4", "--off"}, 0, "region 0,0 to 3,4 off\n"},
            {{"touch", "region", "3", "0", "3", "4", "--on"},
             1,
             "configure_vm_region: Bad parameter (0x4000000D): region 3,0 to 3,4\n"},
    });
    EXPECT_TRUE(stack.awaitLine("touch: region -1,2 to 300,400 on"));
    EXPECT_TRUE(stack.awaitLine("touch: region 0,0 to 3,4 off"));
}

TEST(ManagerCommands, OfTheGestureManager) {
    TouchStack stack(stackOptions("gesture"));
    Files files;
    ASSERT_EQ(0, zelkctl({"gesture", "detect", "start"}).status);
    ASSERT_EQ(0, zelkctl({"gesture", "watch", "-n", "20", "-o", files.path("seen")}).status);
    const std::string seen = files.read("seen");
    ASSERT_EQ(20 * kGestureBytes, seen.size());
    const std::string one = files.write("one", seen.substr(0, kGestureBytes));
    const std::string two = files.write("two", seen.substr(2 * kGestureBytes, 2 * kGestureBytes));
    const std::string cut = files.write("cut", seen.substr(0, kGestureBytes + 5));
    const std::string zeros = files.write("zeros", std::string(kGestureBytes, '\0'));
    const std::string many = files.write("many", std::string(257 * kGestureBytes, '\0'));
    expectRows({
            {{"gesture", "limits"}, 0, "predefined    8\nuser-defined  10\n"},
            {{"gesture", "limits", "--json"}, 0, "{\"predefined\":8,\"userDefined\":10}\n"},
            {{"gesture", "wakeup", "on"}, 0, "wake-up on\n"},
            {{"gesture", "wakeup", "off"}, 0, "wake-up off\n"},
            {{"gesture", "detect", "stop"}, 0, "detection stopped\n"},
            {{"gesture", "detect", "start"}, 0, "detection started\n"},
            {{"gesture", "add", one}, 0, "gesture 9 added\n"},
            {{"gesture", "add", two, two}, 0, "gesture 10 added\n"},
            {{"gesture", "verify", one}, 0, "gesture 9\n"},
            {{"gesture", "disable", "9"}, 0, "gesture 9 disabled\n"},
            {{"gesture", "verify", one}, 1, "verifyGesture: Not Found (0x40000019): " + one + "\n"},
            {{"gesture", "enable", "9"}, 0, "gesture 9 enabled\n"},
            {{"gesture", "delete", "9"}, 0, "gesture 9 deleted\n"},
            {{"gesture", "delete", "9"}, 1, "deleteGesture: Not Found (0x40000019): gesture 9\n"},
            {{"gesture", "delete", "1"},
             1,
             "deleteGesture: Action/command is unsupported (0x4000000E): gesture 1\n"},
            {{"gesture", "add", zeros},
             1,
             "addGesture: Invalid format (0x4000000C): " + zeros + "\n"},
            {{"gesture", "add", files.path("seen")},
             1,
             "addGesture: An unknown error has occurred (0x40000000): 20 records are 1442880 "
             "bytes, "
             "and a transaction carries 14 records at most; nothing was added\n"},
            {{"gesture", "add", cut},
             1,
             cut + " holds 5 bytes more than whole records of 72144 bytes\n"},
            {{"gesture", "add", many},
             1,
             many + " makes it more than 256 records of 72144 bytes\n"},
            {{"gesture", "verify", two}, 1, two + " makes it more than 1 record of 72144 bytes\n"},
            {{"gesture", "add", files.write("empty", "")}, 1, files.path("empty") + " is empty\n"},
            {{"gesture", "verify", "/no/such"},
             1,
             "cannot open /no/such: No such file or directory\n"},
            {{"gesture", "add", "/tmp"}, 1, "cannot read /tmp: Is a directory\n"},
    });
    EXPECT_TRUE(stack.process().isRunning());
}

TEST(ManagerCommands, OfTheHandBiometricManager) {
    TouchStack stack(stackOptions("hand"));
    Files files;
    const RunResult enrolled =
            zelkctl({"hand", "enroll", "-n", "7", "-o", files.path("events"), "--json"});
    EXPECT_EQ(0, enrolled.status);
    EXPECT_EQ(7 * kHandBytes, files.read("events").size());
    for (const std::string& line : splitLines(enrolled.output)) {
        EXPECT_THAT(line, MatchesRegex("\\{\"time\":[0-9]+\\.[0-9]{3},\"size\":10016,"
                                       "\"digest\":\"[0-9a-f]{8}\",\"kind\":\"hand\",.*\\}"));
    }
    expectRows({
            {{"hand", "profiles"}, 0, "hand 1\n1 of 5 profiles\n"},
            {{"hand", "name", "Anna"}, 0, "profile Anna named\n"},
            {{"hand", "rename", "Anna", "B\"\\\n"}, 0, "profile Anna renamed B\"\\?\n"},
            {{"hand", "profiles", "--json"}, 0, "{\"profiles\":[\"B\\\"\\\\\\n\"],\"max\":5}\n"},
            {{"hand", "profiles"}, 0, "B\"\\?\n1 of 5 profiles\n"},
            {{"hand", "rename", "Carl", "Dora"},
             1,
             "renameProfile: Not Found (0x40000019): Carl to Dora\n"},
            {{"hand", "delete", "Carl"}, 1, "deleteProfile: Not Found (0x40000019): Carl\n"},
            {{"hand", "delete", "B\"\\\n"}, 0, "profile B\"\\? deleted\n"},
            {{"hand", "name", "Emil"}, 1, "setProfileName: Invalid state (0x4000000B): Emil\n"},
            {{"hand", "profiles", "--json"}, 0, "{\"profiles\":[],\"max\":5}\n"},
            {{"hand", "security", "3"}, 0, "security level 3\n"},
            {{"hand", "security", "-2"},
             1,
             "setSecurity: Bad parameter (0x4000000D): security level -2\n"},
            {{"hand", "match"}, 0, "matching started\n"},
            {{"hand", "scan"}, 1, "scan: Invalid state (0x4000000B)\n"},
            {{"hand", "match", "--stop"}, 0, "matching stopped\n"},
            {{"hand", "enroll", "--stop"}, 1, "stopEnrollment: Invalid state (0x4000000B)\n"},
            {{"hand", "cancel"}, 1, "cancelScan: Invalid state (0x4000000B)\n"},
            {{"hand", "match"}, 0, "matching started\n"},
            {{"hand", "cancel"}, 0, "cancelled\n"},
            {{"hand", "scan"}, 0, "scan started\n"},
            {{"hand", "wakeup", "on"}, 0, "wake-up on\n"},
            {{"hand", "wakeup", "off"}, 0, "wake-up off\n"},
    });
}

// ---- watching ----

TEST(ManagerCommands, TellGesturesInWords) {
    TouchStack stack({"--gesture-rate", "40"});
    for (const char* feature : {"1", "2", "3", "4"}) {
        ASSERT_EQ(0, zelkctl({"touch", "enable", feature}).status);
    }
    ASSERT_EQ(0, zelkctl({"touch", "region", "0", "0", "1080", "2340"}).status);
    const struct {
        Words filter;
        const char* line;
    } rows[] = {
            {{"--gesture", "circle"}, "circle \\(gesture 5, feature 2\\)"},
            {{"--gesture", "8"}, "square \\(gesture 8, feature 4\\)"},
            {{"--feature", "3"}, "[VZ] \\(gesture [67], feature 3\\)"},
    };
    for (const auto& row : rows) {
        Words command = {"touch", "watch", "--count", "3"};
        command.insert(command.end(), row.filter.begin(), row.filter.end());
        const RunResult watch = zelkctl(command);
        EXPECT_EQ(0, watch.status);
        const std::vector<std::string> lines = splitLines(watch.output);
        EXPECT_EQ(3u, lines.size());
        for (const std::string& line : lines) {
            EXPECT_THAT(line,
                        MatchesRegex("[0-9:]{8}\\.[0-9]{3}  #[0-9]+  " + std::string(row.line) +
                                     "  [0-9]+, [0-9]+ to [0-9]+, [0-9]+ in [0-9]+ ms  "
                                     "inside the region"));
        }
    }
    const RunResult drawn = zelkctl({"touch", "watch", "-n", "1", "--draw"});
    EXPECT_EQ(0, drawn.status);
    EXPECT_EQ(23u, splitLines(drawn.output).size()) << drawn.output;
}

TEST(ManagerCommands, TellHandEventsInWords) {
    TouchStack stack({"--hand-rate", "50"});
    const RunResult enrolled = zelkctl({"hand", "enroll", "-n", "7"});
    EXPECT_EQ(0, enrolled.status);
    const char* words[] = {"enrollment started",        "enrollment progress, 20 %",
                           "enrollment progress, 40 %", "enrollment progress, 60 %",
                           "enrollment progress, 80 %", "enrollment progress, 100 %",
                           "enrollment done as hand 1"};
    const std::vector<std::string> lines = splitLines(enrolled.output);
    ASSERT_EQ(std::size(words), lines.size());
    for (size_t i = 0; i < lines.size(); ++i) {
        EXPECT_THAT(lines[i],
                    MatchesRegex("[0-9:]{8}\\.[0-9]{3}  #[0-9]+  " + std::string(words[i])));
    }
    const RunResult matched = zelkctl({"hand", "match", "-n", "1", "--event", "matched"});
    EXPECT_EQ(0, matched.status);
    EXPECT_THAT(matched.output, MatchesRegex("[0-9:]{8}\\.[0-9]{3}  #[0-9]+  matched hand 1, score "
                                             "[0-9]+ at security level 1\n"));
    // It ended what it began, and there is nothing left to stop.
    const RunResult stopped = zelkctl({"hand", "match", "--stop"});
    EXPECT_EQ(1, stopped.status);
    EXPECT_THAT(stopped.errors, HasSubstr("Invalid state"));
}

TEST(ManagerCommands, WaitForTheEndOfAnActivity) {
    TouchStack stack({"--hand-rate", "50", "--hand-profiles", "1"});
    const std::string start = "[0-9:]{8}\\.[0-9]{3}  #[0-9]+  ";
    // Without a profile no hand is like one.
    const RunResult stranger = zelkctl({"hand", "match", "--wait"});
    EXPECT_EQ(1, stranger.status);
    EXPECT_EQ("zelkctl: not matched\n", stranger.errors);

    const RunResult enrolled = zelkctl({"hand", "enroll", "--wait"});
    EXPECT_EQ(0, enrolled.status) << enrolled.errors;
    const std::vector<std::string> steps = splitLines(enrolled.output);
    ASSERT_EQ(7u, steps.size());
    EXPECT_THAT(steps[2], MatchesRegex(start + "enrollment progress, 40 %"));
    EXPECT_THAT(steps[6], MatchesRegex(start + "enrollment done as hand 1"));

    const RunResult matched = zelkctl({"hand", "match", "--wait", "--json"});
    EXPECT_EQ(0, matched.status) << matched.errors;
    EXPECT_THAT(splitLines(matched.output).back(), HasSubstr("\"name\":\"matched\""));
    EXPECT_EQ(0, zelkctl({"hand", "scan", "--wait"}).status);
    // Nothing is left switched on, and what is refused is no wait.
    EXPECT_THAT(zelkctl({"command", "handstate"}).output, HasSubstr("activity=idle\n"));
    expectRows({{{"hand", "enroll", "--wait"},
                 1,
                 "startEnrollment: Error attempting to acquire resource (0x4000000A)\n"}});
}

TEST(ManagerCommands, EndTheirWaitWhenTheEndWillNotCome) {
    {
        TouchStack stack({"--hand-rate", "0"});
        const RunResult late = zelkctl({"hand", "enroll", "--wait", "--seconds", "0.5"});
        EXPECT_EQ(4, late.status);
        EXPECT_EQ("zelkctl: enrollment done has not come within 0.5 s\n", late.errors);
        EXPECT_THAT(zelkctl({"command", "handstate"}).output, HasSubstr("activity=idle\n"));
    }
    {
        // Ten seconds to the first step.
        TouchStack stack({"--hand-rate", "0.1"});
        ChildProcess scan({binary("zelkctl"), "hand", "scan", "--wait"});
        ASSERT_TRUE(stack.awaitLine("hand: scan"));
        ASSERT_EQ(0, zelkctl({"hand", "cancel"}).status);
        EXPECT_EQ(1, scan.wait());
        EXPECT_EQ("zelkctl: cancelled\n", scan.errors());

        ChildProcess given({binary("zelkctl"), "hand", "enroll", "--wait"});
        ASSERT_TRUE(stack.awaitLine("hand: startEnrollment"));
        given.signal(SIGINT);
        EXPECT_EQ(130, given.wait());
        EXPECT_EQ("zelkctl: interrupted\n", given.errors());
        EXPECT_TRUE(stack.awaitLine("hand: stopEnrollment"));
    }
}

// The service that comes back knows nothing of what the other one was to do.
TEST(ManagerCommands, EndWhenTheServiceDiesThatTheyStartedSomethingIn) {
    const struct {
        Words command;
        const char* begun;
    } rows[] = {
            {{"hand", "match", "--wait"}, "hand: startMatching"},
            {{"hand", "enroll", "--count", "9"}, "hand: startEnrollment"},
            {{"hand", "scan", "--seconds", "60"}, "hand: scan"},
    };
    const Words idle = {"--services", "hand", "--hand-rate", "0"};
    auto stack = std::make_unique<TouchStack>(idle);
    for (const auto& row : rows) {
        Words words = row.command;
        words.insert(words.begin(), binary("zelkctl"));
        ChildProcess orphan(words);
        ASSERT_TRUE(stack->awaitLine(row.begun));
        stack->kill();
        stack = std::make_unique<TouchStack>(idle);
        EXPECT_EQ(3, orphan.wait()) << row.begun;
        EXPECT_EQ("zelkctl: the service died\n", orphan.errors());
        EXPECT_THAT(orphan.output(), Not(HasSubstr("the service")));
    }
}

TEST(ManagerCommands, ShowTheProgressOfAWaitInOneLineOfATerminal) {
    TouchStack stack({"--hand-rate", "1"});
    Terminal terminal("env TERM=vt100 " + binary("zelkctl") + " hand enroll --wait", 80, 20);
    EXPECT_TRUE(terminal.await([](const std::string& text) {
        return testing::Matches(
                MatchesRegex("[0-9:.]+  #[0-9]+  enrollment progress, [0-9]+ %\n+"))(text);
    })) << terminal.text();
    EXPECT_TRUE(terminal.awaitText("ended with 0"));
    EXPECT_THAT(terminal.text(), MatchesRegex("[0-9:.]+  #[0-9]+  enrollment done as hand 1\n"
                                              "ended with 0\n+"));
}

namespace {

struct WatchRow {
    const char* manager;
    Words letEventsFlow;
};

class ManagerWatch : public testing::TestWithParam<WatchRow> {};

}  // namespace

TEST_P(ManagerWatch, GoesOnWithTheRestartedServiceUntilInterrupted) {
    const WatchRow& row = GetParam();
    auto stack = std::make_unique<TouchStack>(stackOptions(row.manager));
    ASSERT_EQ(0, zelkctl(row.letEventsFlow).status);
    ChildProcess watch({binary("zelkctl"), row.manager, "watch"});
    ASSERT_TRUE(watch.awaitOutput("  #"));
    stack->kill();
    ASSERT_TRUE(watch.awaitOutput("  the service died\n"));

    stack = std::make_unique<TouchStack>(stackOptions(row.manager));
    ASSERT_TRUE(watch.awaitOutput("  the service is back\n"));
    // A new touch manager has none of the old one's features, which no other interface could tell.
    while (row.manager == std::string("touch") && watch.isRunning() &&
           watch.errors().find("no feature is enabled") == std::string::npos) {
        std::this_thread::sleep_for(std::chrono::milliseconds(20));
    }
    const size_t before = watch.output().size();
    ASSERT_EQ(0, zelkctl(row.letEventsFlow).status);
    while (watch.isRunning() && watch.output().size() == before) {
        std::this_thread::sleep_for(std::chrono::milliseconds(20));
    }
    watch.signal(SIGINT);
    EXPECT_EQ(0, watch.wait());
    const std::string left = std::string(row.manager) + ": a subscriber unsubscribed, 0 now";
    EXPECT_TRUE(stack->awaitLine(left));
    EXPECT_THAT(splitLines(watch.output()).back(),
                MatchesRegex("[0-9:]{8}\\.[0-9]{3}  #[0-9]+  .*"));
}

TEST_P(ManagerWatch, EndsByItselfAfterSecondsWithoutEvents) {
    TouchStack stack(stackOptions(GetParam().manager));
    const RunResult watch = zelkctl({GetParam().manager, "watch", "--seconds", "0.3"});
    EXPECT_EQ(0, watch.status);
    EXPECT_EQ("", watch.output);
    // Gestures of the touch manager belong to features, of which none is enabled here.
    EXPECT_EQ(GetParam().manager == std::string("touch")
                      ? "zelkctl: no feature is enabled, and nothing will be reported (zelkctl "
                        "touch enable FEATURE)\n"
                      : "",
              watch.errors);
}

INSTANTIATE_TEST_SUITE_P(All, ManagerWatch,
                         testing::Values(WatchRow{"touch", {"touch", "enable", "1"}},
                                         WatchRow{"gesture", {"gesture", "detect", "start"}},
                                         WatchRow{"hand", {"hand", "match"}}),
                         [](const auto& info) { return std::string(info.param.manager); });

TEST(ManagerCommands, TellThatTheServiceIsNotThere) {
    TouchStack stack({"--services", "touch"});
    ChildProcess gesture({binary("zelkctl"), "gesture", "limits"});
    ChildProcess hand({binary("zelkctl"), "hand", "watch"});
    EXPECT_EQ(3, gesture.wait());
    EXPECT_EQ(
            "zelkctl: waiting for the service pemaro.GestureManagerService\n"
            "zelkctl: the service pemaro.GestureManagerService is not running\n",
            gesture.errors());
    EXPECT_EQ(3, hand.wait());
    EXPECT_THAT(hand.errors(),
                HasSubstr("the service pemaro.HandBiometricManagerService is not running\n"));
}

TEST(ManagerCommands, WaitForAServiceThatIsAboutToCome) {
    ChildProcess limits({binary("zelkctl"), "gesture", "limits", "--json"});
    TouchStack stack({"--services", "gesture"});
    EXPECT_EQ(0, limits.wait());
    EXPECT_EQ("{\"predefined\":8,\"userDefined\":10}\n", limits.output());
}

TEST(ManagerCommands, TellTheStatusOfAFaultyService) {
    TouchStack stack({"--fault", "touch.subscribe=status:0x40000006", "--fault",
                      "gesture.getMaxPreDefinedGesture=status:0x40000015", "--fault",
                      "hand.startEnrollment=status:0x40000010", "--fault", "hand.scan=die"});
    expectRows({
            {{"touch", "watch"}, 1, "init: Error allocating memory (0x40000006)\n"},
            {{"gesture", "limits"},
             1,
             "getMaxPreDefinedGesture: Timeout has occurred (0x40000015)\n"},
            {{"hand", "enroll"}, 1, "startEnrollment: Error involving AFE HAL (0x40000010)\n"},
            {{"hand", "enroll", "-n", "1"},
             1,
             "startEnrollment: Error involving AFE HAL (0x40000010)\n"},
            {{"hand", "scan"}, 1, "scan: An unknown error has occurred (0x40000000)\n"},
    });
}

TEST(ManagerCommands, FindAnUnwritableOutputBeforeTheyWatch) {
    TouchStack stack(stackOptions("hand"));
    expectRows({{{"hand", "enroll", "-n", "1", "-o", "/no/such/file"},
                 1,
                 "cannot open /no/such/file: No such file or directory\n"}});
    EXPECT_EQ(std::string::npos, stack.process().output().find("startEnrollment"));
}

TEST(ManagerCommands, StopWhenTheirOutputIsFull) {
    TouchStack stack(stackOptions("touch"));
    ASSERT_EQ(0, zelkctl({"touch", "enable", "1"}).status);
    expectRows({{{"touch", "watch", "-o", "/dev/full"},
                 1,
                 "cannot write /dev/full: No space left on device (it holds the records of 0 "
                 "events)\n"}});
    TouchStack hands(stackOptions("hand"));
    expectRows({{{"hand", "enroll", "--wait", "-o", "/dev/full"},
                 1,
                 "cannot write /dev/full: No space left on device (it holds the records of 0 "
                 "events)\n"}});
}

}  // namespace pemaro::test
