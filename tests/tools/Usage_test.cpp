// SPDX-License-Identifier: Apache-2.0
// What the programs make of their command lines, on a machine with or without a Binder driver.

#include <gtest/gtest.h>
#include <unistd.h>

#include <sstream>
#include <string>
#include <vector>

#include "pemaro/Version.h"
#include "tests/support/ChildProcess.h"

namespace pemaro::test {

namespace {

// A command line, its words separated by spaces.
RunResult runLine(const std::string& line) {
    std::istringstream stream(line);
    std::vector<std::string> words;
    for (std::string word; stream >> word;) {
        words.push_back(word);
    }
    words[0] = ZELK_BIN_DIR "/" + words[0];
    return run(words);
}

struct Misuse {
    const char* line;
    const char* error;
};

class Usage : public ::testing::TestWithParam<Misuse> {};

}  // namespace

TEST_P(Usage, IsRefusedInOneLine) {
    const RunResult result = runLine(GetParam().line);
    EXPECT_EQ(2, result.status);
    EXPECT_EQ("", result.output);
    EXPECT_EQ(GetParam().error + std::string(" (--help tells more)\n"), result.errors);
}

TEST(Version, IsTheLibrarysOwn) {
    for (const char* program : {"zelkctl", "zelk-touchstack"}) {
        const RunResult result = runLine(std::string(program) + " --version");
        EXPECT_EQ(0, result.status);
        EXPECT_EQ(std::string(program) + " " ZELK_VERSION "\n", result.output);
        EXPECT_EQ("", result.errors);
    }
}

INSTANTIATE_TEST_SUITE_P(
        Zelkctl, Usage,
        ::testing::Values(
                Misuse{"zelkctl", "zelkctl: a command is required"},
                Misuse{"zelkctl --log", "zelkctl: a command is required"},
                Misuse{"zelkctl fly", "zelkctl: The following argument was not expected: fly"},
                Misuse{"zelkctl ping now", "zelkctl: The following argument was not expected: now"},
                Misuse{"zelkctl record --frames many",
                       "zelkctl: --frames: Value many not in range 1 to 1000000000000"},
                Misuse{"zelkctl record --frames 0",
                       "zelkctl: --frames: Value 0 not in range 1 to 1000000000000"},
                Misuse{"zelkctl record --frames -5",
                       "zelkctl: --frames: Value -5 not in range 1 to 1000000000000"},
                Misuse{"zelkctl record --frames",
                       "zelkctl: --frames: 1 required UINT:UINT in [1 - 1000000000000] missing"},
                Misuse{"zelkctl record --seconds 0",
                       "zelkctl: --seconds: Value 0 not in range 0.001000 to 1000000.000000"},
                Misuse{"zelkctl record --speed",
                       "zelkctl: The following argument was not expected: --speed"}));

INSTANTIATE_TEST_SUITE_P(
        CompanionCommands, Usage,
        ::testing::Values(
                Misuse{"zelkctl check finger",
                       "zelkctl: SERVICE: finger not in {companion,touch,gesture,hand}"},
                Misuse{"zelkctl check --json --tap", "zelkctl: --json excludes --tap"},
                Misuse{"zelkctl command", "zelkctl: TEXT is required"},
                Misuse{"zelkctl command calibrate 3",
                       "zelkctl: The following argument was not expected: 3"},
                Misuse{"zelkctl filter", "zelkctl: MASK is required"},
                Misuse{"zelkctl property", "zelkctl: a command is required"},
                Misuse{"zelkctl property get",
                       "zelkctl: The following argument was not expected: get"},
                Misuse{"zelkctl property set setRollingLogSize", "zelkctl: VALUE is required"},
                Misuse{"zelkctl event 7", "zelkctl: PARAM is required"},
                Misuse{"zelkctl inspect now",
                       "zelkctl: The following argument was not expected: now"},
                Misuse{"zelkctl auth", "zelkctl: TEXT is required"},
                Misuse{"zelkctl config", "zelkctl: a command is required"},
                Misuse{"zelkctl config get", "zelkctl: KEY is required"},
                Misuse{"zelkctl config load", "zelkctl: FILE is required"},
                Misuse{"zelkctl config save a b",
                       "zelkctl: The following argument was not expected: b"},
                Misuse{"zelkctl session", "zelkctl: a command is required"},
                Misuse{"zelkctl session restore", "zelkctl: ID is required"},
                Misuse{"zelkctl record-file --seconds 0 frames",
                       "zelkctl: --seconds: Value 0 not in range 0.001000 to 1000000.000000"}));

INSTANTIATE_TEST_SUITE_P(
        ManagerCommands, Usage,
        ::testing::Values(
                Misuse{"zelkctl touch", "zelkctl: a command is required"},
                Misuse{"zelkctl gesture", "zelkctl: a command is required"},
                Misuse{"zelkctl hand", "zelkctl: a command is required"},
                Misuse{"zelkctl touch fly",
                       "zelkctl: The following argument was not expected: fly"},
                Misuse{"zelkctl touch enable", "zelkctl: NUMBER is required"},
                Misuse{"zelkctl touch enable x", "zelkctl: Could not convert: NUMBER = x"},
                Misuse{"zelkctl touch region 1 2 3", "zelkctl: BOTTOM is required"},
                Misuse{"zelkctl touch region 1 2 3 4 --on --off", "zelkctl: --on excludes --off"},
                Misuse{"zelkctl touch watch --gesture spiral",
                       "zelkctl: --gesture: there is no gesture 'spiral'; there are swipe-right, "
                       "swipe-left, swipe-up, swipe-down, circle, v, z, square, and the user's by "
                       "their numbers"},
                Misuse{"zelkctl hand watch --event 14",
                       "zelkctl: --event: there is no event '14'; there are enrollment-started, "
                       "enrollment-progress, enrollment-done, enrollment-stopped, scan-started, "
                       "scan-done, matching-started, hand-detected, matched, not-matched, "
                       "matching-stopped, cancelled, wake-up"},
                Misuse{"zelkctl touch watch --count 0",
                       "zelkctl: --count: Value 0 not in range 1 to 1000000000000"},
                Misuse{"zelkctl gesture wakeup", "zelkctl: on|off is required"},
                Misuse{"zelkctl gesture wakeup maybe", "zelkctl: on|off: maybe not in {on,off}"},
                Misuse{"zelkctl gesture detect on", "zelkctl: start|stop: on not in {start,stop}"},
                Misuse{"zelkctl gesture add", "zelkctl: FILE is required"},
                Misuse{"zelkctl gesture verify", "zelkctl: FILE is required"},
                Misuse{"zelkctl gesture delete 1 2",
                       "zelkctl: The following argument was not expected: 2"},
                Misuse{"zelkctl hand security high", "zelkctl: Could not convert: LEVEL = high"},
                Misuse{"zelkctl hand rename Anna", "zelkctl: SECOND is required"},
                Misuse{"zelkctl hand enroll --stop --count 3", "zelkctl: --count excludes --stop"},
                Misuse{"zelkctl hand scan --stop",
                       "zelkctl: The following argument was not expected: --stop"}));

INSTANTIATE_TEST_SUITE_P(
        TouchStack, Usage,
        ::testing::Values(
                Misuse{"zelk-touchstack now",
                       "zelk-touchstack: The following argument was not expected: now"},
                Misuse{"zelk-touchstack --rate -1",
                       "zelk-touchstack: --rate: Value -1 not in range 0.000000 to 100000.000000"},
                Misuse{"zelk-touchstack --frame-bytes 39",
                       "zelk-touchstack: --frame-bytes: Value 39 not in range 40 to 1048576"},
                Misuse{"zelk-touchstack --ring-frames 0",
                       "zelk-touchstack: --ring-frames: Value 0 not in range 1 to 65536"},
                Misuse{"zelk-touchstack --frame-bytes 1048576 --ring-frames 257",
                       "zelk-touchstack: --ring-frames: a ring may take 256 MiB at most"},
                Misuse{"zelk-touchstack --fault open",
                       "zelk-touchstack: --fault: a fault is OPERATION=WHAT, not 'open'"},
                Misuse{"zelk-touchstack --services hand,foot",
                       "zelk-touchstack: --services: there is no 'foot'"},
                Misuse{"zelk-touchstack --gesture-rate 1001",
                       "zelk-touchstack: --gesture-rate: Value 1001 not in range 0.000000 to "
                       "1000.000000"},
                Misuse{"zelk-touchstack --fault touch.scan=die",
                       "zelk-touchstack: --fault: the service has no operation 'touch.scan'"},
                Misuse{"zelk-touchstack --fault open=die --fault fly=die",
                       "zelk-touchstack: --fault: the service has no operation 'fly'"}));

TEST(Help, IsNoFailure) {
    for (const char* line : {"zelkctl --help", "zelkctl record --help", "zelk-touchstack --help"}) {
        const RunResult result = runLine(line);
        EXPECT_EQ(0, result.status);
        EXPECT_EQ("", result.errors);
        EXPECT_NE(std::string::npos, result.output.find("Usage: ")) << result.output;
    }
}

TEST(NoDriver, IsToldInOneLine) {
    if (access("/dev/binder", F_OK) == 0) {
        GTEST_SKIP() << "this machine has a Binder driver";
    }
    const std::string problem =
            ": cannot use the Binder driver /dev/binder: No such file or directory\n";
    for (const char* line :
         {"zelkctl ping", "zelkctl record", "zelkctl inspect", "zelkctl record-file frames",
          "zelkctl touch watch", "zelkctl gesture limits", "zelkctl hand profiles"}) {
        const RunResult result = runLine(line);
        EXPECT_EQ(1, result.status);
        EXPECT_EQ("zelkctl" + problem, result.errors);
    }
    const RunResult result = runLine("zelk-touchstack");
    EXPECT_EQ(1, result.status);
    EXPECT_EQ("zelk-touchstack" + problem, result.errors);
}

// What the command line itself cannot know to be wrong is a failure,
// found before the driver is touched.
TEST(Arguments, AreLookedAtBeforeAnythingIsSent) {
    const auto noNumber = [](const std::string& command, const std::string& argument,
                             const std::string& range) {
        return command + ": Error parsing parameter (" + argument + " is no number from " + range +
               ")";
    };
    const std::string any = "-2147483648 to 4294967295";
    const std::string mask = "0 to 4294967295";
    const std::string badName = "command: Invalid command (a name has no \" and no \\)";
    const struct {
        std::vector<std::string> words;
        std::string error;
    } rows[] = {
            {{"command", "calibrate 3 x"}, noNumber("command", "number: 'x'", any)},
            {{"command", "status "}, noNumber("command", "number: ''", any)},
            {{"command", "calibrate 1  2"}, noNumber("command", "number: ''", any)},
            {{"command", "calibrate 4294967296"}, noNumber("command", "number: '4294967296'", any)},
            {{"command", ""}, "command: Invalid command (it has no name)"},
            {{"command", " 5"}, "command: Invalid command (it has no name)"},
            {{"command", "a\",\"b"}, badName},
            {{"command", "a\\"}, badName},
            {{"filter", "0x1g"}, noNumber("filter", "MASK: '0x1g'", mask)},
            {{"filter", "-1"}, noNumber("filter", "MASK: '-1'", mask)},
            {{"filter", ""}, noNumber("filter", "MASK: ''", mask)},
            {{"property", "set", "setRollingLogSize", "1k"},
             noNumber("property set", "number: '1k'", any)},
            {{"event", "x", "1"}, noNumber("event", "TYPE: 'x'", any)},
            {{"event", "1", "x"}, noNumber("event", "PARAM: 'x'", any)},
            {{"session", "restore", "2147483648"},
             noNumber("session restore", "ID: '2147483648'", "-2147483648 to 2147483647")},
            {{"config", "get", "gain", "a\""}, "config get: Bad parameter (KEY: 'a\"' is no key)"},
            {{"config", "get", "a\\"}, "config get: Bad parameter (KEY: 'a\\' is no key)"},
            {{"config", "get", ""}, "config get: Bad parameter (KEY: '' is no key)"},
            {{"config", "load", "/no/such/file"},
             "config load: Error opening file (/no/such/file: No such file or directory)"},
            {{"config", "load", "/"}, "config load: Error reading file (/: Is a directory)"},
            {{"config", "load", "/dev/zero"},
             "config load: Data size exceeds size of buffer (/dev/zero has more than 1039360 "
             "bytes, "
             "the most that a transaction carries)"},
    };
    for (const auto& row : rows) {
        std::vector<std::string> words = row.words;
        words.insert(words.begin(), ZELK_BIN_DIR "/zelkctl");
        const RunResult result = run(words);
        EXPECT_EQ(1, result.status) << row.error;
        EXPECT_EQ("", result.output);
        EXPECT_EQ("zelkctl: " + row.error + "\n", result.errors);
    }
}

}  // namespace pemaro::test
