// SPDX-License-Identifier: Apache-2.0
// What the programs make of their command lines, on a machine with or without a Binder driver.

#include <gtest/gtest.h>
#include <signal.h>
#include <sys/stat.h>
#include <unistd.h>

#include <chrono>
#include <sstream>
#include <string>
#include <thread>
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
    for (const char* line : {"zelkctl --version", "zelk-touchstack --version",
                             // Wherever it is asked for, and whatever else is missing.
                             "zelkctl ping --version", "zelkctl hand --version",
                             "zelkctl hand rename --version", "zelkctl frames export --version"}) {
        const RunResult result = runLine(line);
        const std::string program = std::string(line).substr(0, std::string(line).find(' '));
        EXPECT_EQ(0, result.status) << line;
        EXPECT_EQ(program + " " ZELK_VERSION "\n", result.output) << line;
        EXPECT_EQ("", result.errors);
    }
}

TEST(Help, IsAnObjectOnRequest) {
    const RunResult result = runLine("zelkctl help session restore --json");
    EXPECT_EQ(0, result.status);
    EXPECT_EQ("", result.errors);
    EXPECT_EQ(
            "{\"command\":\"zelkctl session restore\",\"help\":\"Go back to the settings of a "
            "session\",\"details\":\"\",\"operands\":[{\"name\":\"SESSION\",\"help\":\"The "
            "session's "
            "number\"}],\"options\":[{\"name\":\"--help\",\"help\":\"Print this help message and "
            "exit\"},{\"name\":\"--json\",\"help\":\"Print results and errors as JSON, one object "
            "a "
            "line\"},{\"name\":\"--timeout\",\"help\":\"Give a call up after so many seconds, and "
            "exit with 4\",\"value\":\"SECONDS\"}],\"commands\":[]}\n",
            result.output);
    const std::string all = runLine("zelkctl --json help").output;
    EXPECT_NE(std::string::npos,
              all.find("{\"name\":\"ping\",\"help\":\"Ask whether the touch service is alive\"}"));
    EXPECT_EQ(std::string::npos, all.find("\"words\""));
}

INSTANTIATE_TEST_SUITE_P(
        Zelkctl, Usage,
        ::testing::Values(
                Misuse{"zelkctl fly", "zelkctl: there is no command 'fly'"},
                Misuse{"zelkctl recrod --frmes 5",
                       "zelkctl: there is no command 'recrod'; did you mean 'record'?"},
                Misuse{"zelkctl --jsn recrod",
                       "zelkctl: there is no option '--jsn'; did you mean '--json'?"},
                Misuse{"zelkctl record --frmes 5 --output",
                       "zelkctl: there is no option '--frmes'; did you mean '--frames'?"},
                Misuse{"zelkctl help recrod",
                       "zelkctl: there is no command 'recrod'; did you mean 'record'?"},
                Misuse{"zelkctl status 4x",
                       "zelkctl: NUMBER: '4x' is no number from -2147483648 to 4294967295"},
                Misuse{"zelkctl ping --timeout nan",
                       "zelkctl: --timeout: 'nan' is no number from 0.001 to 1000000"},
                Misuse{"zelkctl ping --timeout 0",
                       "zelkctl: --timeout: '0' is no number from 0.001 to 1000000"},
                Misuse{"zelkctl trace nobody", "zelkctl: SERVICE: there is no 'nobody'"},
                Misuse{"zelkctl trace --count 0",
                       "zelkctl: --count: '0' is no number from 1 to 1000000000000"},
                Misuse{"zelkctl ping now", "zelkctl: the argument 'now' is one too many"},
                Misuse{"zelkctl record --frames many",
                       "zelkctl: --frames: 'many' is no number from 1 to 1000000000000"},
                Misuse{"zelkctl record --frames 0",
                       "zelkctl: --frames: '0' is no number from 1 to 1000000000000"},
                Misuse{"zelkctl record --frames -5",
                       "zelkctl: --frames: '-5' is no number from 1 to 1000000000000"},
                Misuse{"zelkctl record --frames", "zelkctl: --frames: a value is missing"},
                Misuse{"zelkctl record --seconds 0",
                       "zelkctl: --seconds: '0' is no number from 0.001 to 1000000"},
                Misuse{"zelkctl record --speed", "zelkctl: there is no option '--speed'"}));

INSTANTIATE_TEST_SUITE_P(
        ValuesOfFlags, Usage,
        ::testing::Values(
                Misuse{"zelkctl --json=nonsense", "zelkctl: --json: it takes no value"},
                Misuse{"zelkctl status --json=false", "zelkctl: --json: it takes no value"},
                Misuse{"zelkctl status --json= 0", "zelkctl: --json: it takes no value"},
                Misuse{"zelkctl --log=1 status", "zelkctl: --log: it takes no value"},
                Misuse{"zelkctl --version=x", "zelkctl: --version: it takes no value"},
                Misuse{"zelkctl ping --help=x", "zelkctl: --help: it takes no value"},
                Misuse{"zelkctl ping -hx", "zelkctl: -h: it takes no value"},
                Misuse{"zelkctl check --tap=yes", "zelkctl: --tap: it takes no value"},
                Misuse{"zelkctl hand enroll --stop=1", "zelkctl: --stop: it takes no value"},
                Misuse{"zelk-touchstack --loop=2", "zelk-touchstack: --loop: it takes no value"}));

INSTANTIATE_TEST_SUITE_P(
        ControlCharacters, Usage,
        ::testing::Values(
                Misuse{"zelkctl x\x1b[31mred", "zelkctl: there is no command 'x?[31mred'"},
                Misuse{"zelkctl help x\x1b[31mred", "zelkctl: there is no command 'x?[31mred'"},
                Misuse{"zelkctl --x\x1b[31mred", "zelkctl: there is no option '--x?[31mred'"},
                Misuse{"zelkctl status \x7f",
                       "zelkctl: NUMBER: '?' is no number from -2147483648 to 4294967295"},
                Misuse{"zelk-touchstack \x1b[31mred",
                       "zelk-touchstack: the argument '?[31mred' is one too many"}));

INSTANTIATE_TEST_SUITE_P(
        CompanionCommands, Usage,
        ::testing::Values(
                Misuse{"zelkctl check finger", "zelkctl: SERVICE: there is no 'finger'"},
                Misuse{"zelkctl check touch gestur",
                       "zelkctl: SERVICE: there is no 'gestur'; did you mean 'gesture'?"},
                Misuse{"zelkctl command", "zelkctl: TEXT is required"},
                Misuse{"zelkctl command calibrate 3", "zelkctl: the argument '3' is one too many"},
                Misuse{"zelkctl filter", "zelkctl: MASK is required"},
                Misuse{"zelkctl property", "zelkctl: property: a command is required"},
                Misuse{"zelkctl property gte",
                       "zelkctl: there is no command 'gte'; did you mean 'get'?"},
                Misuse{"zelkctl property set setRollingLogSize", "zelkctl: VALUE is required"},
                Misuse{"zelkctl event 7", "zelkctl: PARAM is required"},
                Misuse{"zelkctl inspect now", "zelkctl: the argument 'now' is one too many"},
                Misuse{"zelkctl auth", "zelkctl: TEXT is required"},
                Misuse{"zelkctl config", "zelkctl: config: a command is required"},
                Misuse{"zelkctl config get", "zelkctl: KEY is required"},
                Misuse{"zelkctl config load", "zelkctl: FILE is required"},
                Misuse{"zelkctl config save a b", "zelkctl: the argument 'b' is one too many"},
                Misuse{"zelkctl session", "zelkctl: session: a command is required"},
                Misuse{"zelkctl session restore", "zelkctl: SESSION is required"},
                Misuse{"zelkctl record-file --seconds 0 frames",
                       "zelkctl: --seconds: '0' is no number from 0.001 to 1000000"}));

// One reader of numbers for all commands.
INSTANTIATE_TEST_SUITE_P(
        FramesCommands, Usage,
        ::testing::Values(Misuse{"zelkctl frames export f -f csv --first 08",
                                 "zelkctl: --first: '08' is no number from 0 to 1000000000000"},
                          Misuse{"zelkctl frames export f -f csv --last 1.5",
                                 "zelkctl: --last: '1.5' is no number from 0 to 1000000000000"},
                          Misuse{"zelkctl frames export f -f csv --every 0",
                                 "zelkctl: --every: '0' is no number from 1 to 1000000000000"},
                          Misuse{"zelkctl frames export f -f png --scale 65",
                                 "zelkctl: --scale: '65' is no number from 1 to 64"},
                          Misuse{"zelkctl frames report f -o page --every -1",
                                 "zelkctl: --every: '-1' is no number from 1 to 1000000"}));

INSTANTIATE_TEST_SUITE_P(
        ManagerCommands, Usage,
        ::testing::Values(
                Misuse{"zelkctl touch", "zelkctl: touch: a command is required"},
                Misuse{"zelkctl gesture", "zelkctl: gesture: a command is required"},
                Misuse{"zelkctl hand", "zelkctl: hand: a command is required"},
                Misuse{"zelkctl touch fly", "zelkctl: there is no command 'fly'"},
                Misuse{"zelkctl touch enable", "zelkctl: FEATURE is required"},
                Misuse{"zelkctl touch enable x",
                       "zelkctl: FEATURE: 'x' is no number from -2147483648 to 2147483647"},
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
                       "zelkctl: --count: '0' is no number from 1 to 1000000000000"},
                Misuse{"zelkctl gesture wakeup", "zelkctl: on|off is required"},
                Misuse{"zelkctl gesture wakeup maybe",
                       "zelkctl: on|off: 'maybe' is neither of them"},
                Misuse{"zelkctl gesture detect strat",
                       "zelkctl: start|stop: 'strat' is neither of them; did you mean 'start'?"},
                Misuse{"zelkctl gesture detect on", "zelkctl: start|stop: 'on' is neither of them"},
                Misuse{"zelkctl gesture add", "zelkctl: FILE is required"},
                Misuse{"zelkctl gesture verify", "zelkctl: FILE is required"},
                Misuse{"zelkctl gesture delete 1 2", "zelkctl: the argument '2' is one too many"},
                Misuse{"zelkctl hand security high",
                       "zelkctl: LEVEL: 'high' is no number from -2147483648 to 2147483647"},
                Misuse{"zelkctl hand rename Anna", "zelkctl: NAME is required"},
                Misuse{"zelkctl hand enroll --stop --count 3", "zelkctl: --count excludes --stop"},
                Misuse{"zelkctl hand enroll --output file",
                       "zelkctl: --output needs --count, --seconds or --wait"},
                Misuse{"zelkctl touch features --first 5 --last 2",
                       "zelkctl: --first: 5 is behind --last, 2"},
                Misuse{"zelkctl afe get gain --channels", "zelkctl: --channels excludes PARAMETER"},
                Misuse{"zelkctl afe set gain", "zelkctl: 'gain' is no KEY=VALUE"},
                Misuse{"zelkctl config set =5", "zelkctl: there is no name"},
                Misuse{"zelkctl config set gain=", "zelkctl: gain is given no value"},
                Misuse{"zelkctl hand scan --stop", "zelkctl: there is no option '--stop'"}));

INSTANTIATE_TEST_SUITE_P(
        TouchStack, Usage,
        ::testing::Values(
                Misuse{"zelk-touchstack now",
                       "zelk-touchstack: the argument 'now' is one too many"},
                Misuse{"zelk-touchstack --rate -1",
                       "zelk-touchstack: --rate: '-1' is no number from 0 to 100000"},
                Misuse{"zelk-touchstack --frame-bytes 39",
                       "zelk-touchstack: --frame-bytes: '39' is no number from 40 to 1048576"},
                Misuse{"zelk-touchstack --ring-frames 0",
                       "zelk-touchstack: --ring-frames: '0' is no number from 1 to 65536"},
                Misuse{"zelk-touchstack --source keyboard",
                       "zelk-touchstack: --source: 'keyboard' is neither evdev: and a device, nor "
                       "list"},
                Misuse{"zelk-touchstack --source list --fingers 2",
                       "zelk-touchstack: --fingers excludes --source"},
                Misuse{"zelk-touchstack --frame-bytes 1048576 --ring-frames 257",
                       "zelk-touchstack: --ring-frames: a ring may take 256 MiB at most"},
                Misuse{"zelk-touchstack --fault open",
                       "zelk-touchstack: --fault: a fault is OPERATION=WHAT, not 'open'"},
                Misuse{"zelk-touchstack --services hand,foot",
                       "zelk-touchstack: --services: there is no 'foot'"},
                Misuse{"zelk-touchstack --services hnad",
                       "zelk-touchstack: --services: there is no 'hnad'; did you mean 'hand'?"},
                Misuse{"zelk-touchstack --remind 08",
                       "zelk-touchstack: --remind: '08' is no number from 0 to 1000000"},
                Misuse{"zelk-touchstack --gesture-rate 1001",
                       "zelk-touchstack: --gesture-rate: '1001' is no number from 0 to 1000"},
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
        EXPECT_EQ(3, result.status);
        EXPECT_EQ("zelkctl" + problem, result.errors);
    }
    const RunResult result = runLine("zelk-touchstack");
    EXPECT_EQ(3, result.status);
    EXPECT_EQ("zelk-touchstack" + problem, result.errors);
}

// What the parser itself cannot know to be wrong, found before the driver is touched.
TEST(Arguments, AreLookedAtBeforeAnythingIsSent) {
    const std::string any = " is no number from -2147483648 to 4294967295";
    const std::string mask = " is no number from 0 to 4294967295";
    const struct {
        std::vector<std::string> words;
        std::string error;
    } rows[] = {
            {{"command", "calibrate 3 x"}, "TEXT: 'x'" + any},
            {{"command", "status "}, "TEXT: ''" + any},
            {{"command", "calibrate 1  2"}, "TEXT: ''" + any},
            {{"command", "calibrate 4294967296"}, "TEXT: '4294967296'" + any},
            {{"command", " 5"}, "TEXT: there is no name"},
            {{"command", "a\",\"b"}, "TEXT: 'a\",\"b' is no name: it has a quote or a backslash"},
            {{"command", "a\\"}, "TEXT: 'a\\' is no name: it has a quote or a backslash"},
            {{"filter", "0x1g"}, "MASK: '0x1g'" + mask},
            {{"filter", "-1"}, "MASK: '-1'" + mask},
            {{"property", "set", "setRollingLogSize", "1k"}, "VALUE: '1k'" + any},
            {{"event", "x", "1"}, "TYPE: 'x'" + any},
            {{"event", "1", "x"}, "PARAM: 'x'" + any},
            {{"session", "restore", "2147483648"},
             "SESSION: '2147483648' is no number from -2147483648 to 2147483647"},
            {{"config", "get", "gain", "a\""},
             "KEY: 'a\"' is no name: it has a quote or a backslash"},
            {{"config", "set", "gain=a\"b"}, "the value of gain has a quote"},
    };
    for (const auto& row : rows) {
        std::vector<std::string> words = row.words;
        words.insert(words.begin(), ZELK_BIN_DIR "/zelkctl");
        const RunResult result = run(words);
        EXPECT_EQ(2, result.status) << row.error;
        EXPECT_EQ("", result.output);
        EXPECT_EQ("zelkctl: " + row.error + " (--help tells more)\n", result.errors);
    }
}

TEST(Arguments, AreNotEmpty) {
    const struct {
        std::vector<std::string> words;
        std::string what;
    } rows[] = {
            {{"zelkctl", "command", ""}, "TEXT: the argument is empty"},
            {{"zelkctl", "filter", ""}, "MASK: the argument is empty"},
            {{"zelkctl", "config", "get", "gain", ""}, "KEY: the argument is empty"},
            {{"zelkctl", "config", "reload", ""}, "PATH: the argument is empty"},
            {{"zelkctl", "config", "dump", ""}, "FILE: the argument is empty"},
            {{"zelkctl", "record-file", ""}, "PATH: the argument is empty"},
            {{"zelkctl", "record", "-o", ""}, "-o: the value is empty"},
            {{"zelkctl", "record", "--output="}, "--output: the value is empty"},
            {{"zelkctl", "record", "--frames", ""}, "--frames: the value is empty"},
            {{"zelkctl", "hand", "security", ""}, "LEVEL: the argument is empty"},
            {{"zelkctl", "hand", "rename", "Anna", ""}, "NAME: the argument is empty"},
            {{"zelkctl", ""}, "there is no command ''"},
            {{"zelk-touchstack", "--auth", ""}, "--auth: the value is empty"},
    };
    for (const auto& row : rows) {
        std::vector<std::string> words = row.words;
        const std::string program = words[0];
        words[0] = ZELK_BIN_DIR "/" + program;
        const RunResult result = run(words);
        EXPECT_EQ(2, result.status) << row.what;
        EXPECT_EQ("", result.output);
        EXPECT_EQ(program + ": " + row.what + " (--help tells more)\n", result.errors);
    }
}

TEST(Arguments, ArriveAsTheyAreTyped) {
    const struct {
        std::vector<std::string> words;
        int status;
        std::string output;
        std::string errors;
    } rows[] = {
            {{"--", "status", "0"}, 0, "0x00000000           0  No error\n", ""},
            {{"status", "--", "0"}, 0, "0x00000000           0  No error\n", ""},
            {{"status", "++"},
             2,
             "",
             "zelkctl: NUMBER: '++' is no number from -2147483648 to 4294967295 (--help tells "
             "more)\n"},
            {{"gesture", "add", "[/no/x]"},
             1,
             "",
             "zelkctl: cannot open [/no/x]: No such file or directory\n"},
            {{"gesture", "add", "[/no/a,b]"},
             1,
             "",
             "zelkctl: cannot open [/no/a,b]: No such file or directory\n"},
            {{"frames", "stat", "++"},
             1,
             "",
             "zelkctl: cannot read ++: No such file or directory\n"},
            // What is an operand asks for no JSON.
            {{"gesture", "add", "--", "--json"},
             1,
             "",
             "zelkctl: cannot open --json: No such file or directory\n"},
    };
    for (const auto& row : rows) {
        std::vector<std::string> words = row.words;
        words.insert(words.begin(), ZELK_BIN_DIR "/zelkctl");
        const RunResult result = run(words);
        EXPECT_EQ(row.status, result.status) << row.errors;
        EXPECT_EQ(row.output, result.output);
        EXPECT_EQ(row.errors, result.errors);
    }
}

TEST(Arguments, ThatAreFilesWhichCannotBeReadAreFailures) {
    const struct {
        const char* line;
        const char* error;
    } rows[] = {
            {"zelkctl config load /no/such/file",
             "config load: Error opening file (0x40000001): /no/such/file: No such file or "
             "directory"},
            {"zelkctl config load /",
             "config load: Error reading file (0x4000000F): /: Is a directory"},
            {"zelkctl config load /dev/zero",
             "config load: Data size exceeds size of buffer (0x4000001A): /dev/zero has more than "
             "1039360 bytes, the most that a transaction carries"},
    };
    for (const auto& row : rows) {
        const RunResult result = runLine(row.line);
        EXPECT_EQ(1, result.status);
        EXPECT_EQ("", result.output);
        EXPECT_EQ(std::string("zelkctl: ") + row.error + "\n", result.errors);
    }
}

TEST(Help, OfACommandIsWhatItsOptionPrints) {
    const struct {
        const char* asked;
        const char* option;
    } rows[] = {
            {"zelkctl", "zelkctl --help"},
            {"zelkctl --json", "zelkctl --help"},
            {"zelkctl help", "zelkctl --help"},
            {"zelkctl help record", "zelkctl record --help"},
            {"zelkctl help touch", "zelkctl touch --help"},
            {"zelkctl help touch watch", "zelkctl touch watch --help"},
    };
    for (const auto& row : rows) {
        const RunResult asked = runLine(row.asked);
        EXPECT_EQ(0, asked.status);
        EXPECT_EQ("", asked.errors);
        EXPECT_EQ(runLine(row.option).output, asked.output) << row.asked;
    }
}

// A command that is typed first is the only one that is made.
TEST(Help, OfEachCommandIsThatOfTheCommandAlone) {
    const std::string all = runLine("zelkctl help --json").output;
    const std::string name = "{\"name\":\"";
    size_t commands = 0;
    for (size_t at = all.find("\"commands\":"); (at = all.find(name, at)) != std::string::npos;
         ++commands) {
        at += name.size();
        const std::string command = all.substr(at, all.find('"', at) - at);
        EXPECT_EQ(runLine("zelkctl help " + command).output,
                  runLine("zelkctl " + command + " --help").output);
    }
    EXPECT_LT(20u, commands);
    EXPECT_EQ(runLine("zelkctl help words").output, runLine("zelkctl words --help").output);
}

TEST(Status, IsExplained) {
    EXPECT_EQ("0x4000000B  1073741835  Invalid state\n",
              runLine("zelkctl status 0x4000000B").output);
    EXPECT_EQ("{\"status\":1073741835,\"code\":\"0x4000000B\",\"message\":\"Invalid state\"}\n",
              runLine("zelkctl status 1073741835 --json").output);
    const RunResult all = runLine("zelkctl status");
    EXPECT_EQ(31u, splitLines(all.output).size());
    EXPECT_EQ("0x4000001D  1073741853  Corrupt data", splitLines(all.output).back());
    const RunResult unknown = runLine("zelkctl status 7");
    EXPECT_EQ(1, unknown.status);
    EXPECT_EQ("zelkctl: 0x00000007 is no status of the touch stack\n", unknown.errors);
}

TEST(JsonErrors, AreOneObjectALine) {
    const RunResult usage = runLine("zelkctl touch enable x --json");
    EXPECT_EQ(2, usage.status);
    EXPECT_EQ(
            "{\"error\":\"FEATURE: 'x' is no number from -2147483648 to 2147483647\",\"exit\":2}\n",
            usage.errors);
    const RunResult both = runLine("zelkctl check --json --tap");
    EXPECT_EQ(2, both.status);
    EXPECT_EQ("{\"error\":\"--tap excludes --json\",\"exit\":2}\n", both.errors);
    const RunResult file = runLine("zelkctl --json config load /no/such");
    EXPECT_EQ(1, file.status);
    EXPECT_EQ(
            "{\"error\":\"config load: Error opening file (0x40000001): /no/such: No such file or "
            "directory\",\"operation\":\"config load\",\"status\":1073741825,\"code\":"
            "\"0x40000001\",\"message\":\"Error opening file\",\"about\":\"/no/such: No such file "
            "or directory\",\"exit\":1}\n",
            file.errors);
}

// ---- an output that takes nothing, and a command that has to end ----

namespace {

// What a shell makes of a command line in which BIN is the programs' folder.
RunResult runShell(std::string line) {
    for (size_t at; (at = line.find("BIN/")) != std::string::npos;) {
        line.replace(at, 3, ZELK_BIN_DIR);
    }
    return run({"bash", "-c", line});
}

}  // namespace

TEST(Output, ThatTakesNothingIsAFailure) {
    const struct {
        const char* line;
        const char* error;
    } rows[] = {
            {"BIN/zelkctl status >/dev/full",
             "zelkctl: cannot write the standard output: No space left on device\n"},
            {"BIN/zelkctl --help >/dev/full",
             "zelkctl: cannot write the standard output: No space left on device\n"},
            {"BIN/zelkctl --version >&-",
             "zelkctl: cannot write the standard output: Bad file descriptor\n"},
            {"BIN/zelkctl help >&-",
             "zelkctl: cannot write the standard output: Bad file descriptor\n"},
            {"BIN/zelkctl status --json >/dev/full",
             "{\"error\":\"cannot write the standard output: No space left on device\","
             "\"exit\":1}\n"},
            {"BIN/zelk-touchstack --version >/dev/full",
             "zelk-touchstack: cannot write the standard output: No space left on device\n"},
            {"BIN/zelk-touchstack >&-",
             "zelk-touchstack: cannot write the standard output: Bad file descriptor\n"},
            {"set -o pipefail; (sleep 0.2; BIN/zelkctl status) | true",
             "zelkctl: cannot write the standard output: Broken pipe\n"},
    };
    for (const auto& row : rows) {
        const RunResult result = runShell(row.line);
        EXPECT_EQ(1, result.status) << row.line;
        EXPECT_EQ(row.error, result.errors) << row.line;
    }
}

TEST(Signals, EndACommandThatWaitsForAFile) {
    const std::string fifo = testing::TempDir() + "Usage_test.fifo." + std::to_string(getpid());
    ASSERT_EQ(0, mkfifo(fifo.c_str(), 0600));
    for (const int number : {SIGINT, SIGTERM}) {
        ChildProcess load({ZELK_BIN_DIR "/zelkctl", "config", "load", fifo});
        std::this_thread::sleep_for(std::chrono::milliseconds(1000));
        const auto begin = std::chrono::steady_clock::now();
        load.signal(number);
        EXPECT_EQ(128 + number, load.wait());
        EXPECT_EQ("zelkctl: interrupted while reading " + fifo + "\n", load.errors());
        EXPECT_LT(std::chrono::steady_clock::now() - begin, std::chrono::seconds(5));
    }
    unlink(fifo.c_str());
}

}  // namespace pemaro::test
