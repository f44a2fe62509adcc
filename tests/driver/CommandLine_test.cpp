// SPDX-License-Identifier: Apache-2.0
// What all commands of zelkctl have in common: objects instead of words, an output that fails, files that stay
// what they are, and an end in time whatever a service does.

#include "pemaro/Binder.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <signal.h>
#include <sys/mount.h>
#include <sys/stat.h>
#include <sys/sysmacros.h>
#include <unistd.h>

#include <chrono>
#include <string>
#include <thread>
#include <vector>

#include "pemaro/Status.h"
#include "pemaro/TouchCompanionClient.h"
#include "tests/driver/CommandRows.h"
#include "tests/driver/DriverSetting.h"
#include "tests/driver/FrameCollector.h"
#include "tests/support/Terminal.h"

using testing::HasSubstr;
using testing::MatchesRegex;
using testing::Not;
using testing::StartsWith;

namespace pemaro::test {

namespace {

// What a shell makes of a line in which zelkctl stands for the program.
RunResult runShell(const std::string& line) {
    return run({"bash", "-c", "zelkctl() { " + binary("zelkctl") + " \"$@\"; }; " + line});
}

mode_t kindOf(const std::string& path) {
    struct stat info {};
    return lstat(path.c_str(), &info) == 0 ? info.st_mode & S_IFMT : 0;
}

// How long a program takes from now on, at most this many seconds on a busy machine.
void expectEndsSoon(ChildProcess& process, int status) {
    const auto begin = std::chrono::steady_clock::now();
    EXPECT_EQ(status, process.wait());
    EXPECT_LT(std::chrono::steady_clock::now() - begin, std::chrono::seconds(5));
}

}  // namespace

// ---- results as objects ----

TEST(Json, IsWhatEveryCommandPrintsOnRequest) {
    TouchStack stack({"--gesture-rate", "0", "--hand-rate", "0"});
    Files files;
    const std::string file = files.path("file");
    expectRows({
            {{"ping", "--json"}, 0, "{\"alive\":true}\n"},
            {{"--json", "ping"}, 0, "{\"alive\":true}\n"},
            {{"filter", "1", "--json"}, 0, "{\"filter\":1}\n"},
            {{"property", "set", "setRollingLogSize", "512", "--json"},
             0,
             "{\"property\":\"setRollingLogSize\",\"value\":512}\n"},
            {{"property", "get", "--json"},
             0,
             "{\"authenticated\":false,\"events\":0,\"recordFilter\":1,\"rollingLogSize\":512,"
             "\"sessions\":0}\n"},
            {{"event", "1", "2", "--json"}, 0, "{\"type\":1,\"param\":2}\n"},
            {{"auth", "zelk", "--json"}, 0, "{\"authenticated\":true}\n"},
            {{"config", "set", "gain=2.5", "--json"}, 0, "{\"gain\":2.5}\n"},
            {{"session", "save", "--json"}, 0, "{\"session\":1}\n"},
            {{"session", "list", "--json"}, 0, "{\"session\":1}\n"},
            {{"session", "restore", "1", "--json"}, 0, "{\"session\":1}\n"},
            {{"touch", "enable", "1", "--json"}, 0, "{\"feature\":1,\"enabled\":true}\n"},
            {{"touch", "disable", "1", "--json"}, 0, "{\"feature\":1,\"disabled\":true}\n"},
            {{"touch", "region", "1", "2", "3", "4", "--off", "--json"},
             0,
             "{\"left\":1,\"top\":2,\"right\":3,\"bottom\":4,\"on\":false}\n"},
            {{"gesture", "wakeup", "on", "--json"}, 0, "{\"wakeup\":true}\n"},
            {{"gesture", "detect", "stop", "--json"}, 0, "{\"detect\":false}\n"},
            {{"gesture", "disable", "2", "--json"}, 0, "{\"gesture\":2,\"disabled\":true}\n"},
            {{"hand", "security", "2", "--json"}, 0, "{\"security\":2}\n"},
            {{"hand", "match", "--json"}, 0, "{\"matching\":\"started\"}\n"},
            {{"hand", "match", "--stop", "--json"}, 0, "{\"matching\":\"stopped\"}\n"},
            {{"hand", "wakeup", "off", "--json"}, 0, "{\"wakeup\":false}\n"},
    });
    EXPECT_THAT(zelkctl({"config", "dump", file, "--json"}).output,
                MatchesRegex("\\{\"bytes\":[0-9]+,\"path\":\"" + file + "\"\\}\n"));
    const RunResult refusal = zelkctl({"session", "restore", "7", "--json"});
    EXPECT_EQ(
            "{\"error\":\"restoreSession: Not Found (0x40000019): session 7\",\"operation\":"
            "\"restoreSession\",\"status\":1073741849,\"code\":\"0x40000019\",\"message\":"
            "\"Not Found\",\"about\":\"session 7\",\"exit\":1}\n",
            refusal.errors);
    const RunResult record = zelkctl({"record", "--frames", "3", "--json"});
    EXPECT_THAT(
            record.output,
            MatchesRegex("\\{\"frames\":3,\"bytes\":[0-9]+,\"seconds\":[0-9.]+,\"rate\":[0-9.]+,"
                         "\"sequenced\":true,\"lost\":0,\"gaps\":0,\"corrupt\":0\\}\n"));
}

// ---- what is set, read ----

TEST(Settings, CanBeReadAndListed) {
    TouchStack stack({"--gesture-rate", "0", "--hand-rate", "0"});
    expectRows({
            {{"config", "set", "gain=2.5", "panel.size={\"height\":1,\"width\":2}",
              "device.name=a panel"},
             0,
             "device.name=a panel\ngain=2.5\npanel.size={\"height\":1,\"width\":2}\n"},
            {{"config", "set", "gain=3", "volume=11"},
             1,
             "config set: Error parsing configuration setting (0x40000003): gain, volume\n"},
            {{"config", "list"},
             0,
             "device.name=a panel\nedge.zones=[0,120,240]\ngain=2.5\nnoise.threshold=12\n"
             "palm.rejection=true\npanel.size={\"height\":1,\"width\":2}\nreport.rate=240\n"
             "touch.threshold=80\n"},
            {{"config", "get", "gain", "volume", "brightness"},
             1,
             "getConfigParams: Not Found (0x40000019): volume, brightness\n"},
            {{"property", "get", "rollingLogSize"}, 0, "rollingLogSize=256\n"},
            {{"property", "get", "volume"}, 1, "property get: Not Found (0x40000019): volume\n"},
            {{"property", "get", "++"}, 1, "property get: Not Found (0x40000019): ++\n"},
            {{"afe", "set", "frequency=5"}, 0, "frequency=5\n"},
            {{"afe", "get", "frequency"}, 0, "frequency=5\n"},
            {{"afe", "set", "volume=5"}, 1, "setAFEParams: Bad parameter (0x4000000D): volume\n"},
            {{"session", "list"}, 0, ""},
            {{"session", "save"}, 0, "session 1\n"},
            {{"session", "save"}, 0, "session 2\n"},
            {{"session", "list"}, 0, "1\n2\n"},
            {{"gesture", "disable", "2"}, 0, "gesture 2 disabled\n"},
            {{"touch", "enable", "3"}, 0, "feature 3 enabled\n"},
            {{"words", "SESSION"}, 0, "1\n2\n"},
            {{"words", "FEATURE"}, 0, "1\n2\n3\n4\n"},
            {{"words", "GESTURE"}, 0, "1\n2\n3\n4\n5\n6\n7\n8\n"},
            {{"words", "SETTING"}, 0, "setRollingLogSize\n"},
    });
    EXPECT_THAT(zelkctl({"gesture", "list"}).output,
                StartsWith("         1  enabled   predefined\n         2  disabled  predefined\n"));
    EXPECT_THAT(zelkctl({"afe", "get", "--channels"}).output, StartsWith("[{\"channel\":0,"));
    const std::string info = zelkctl({"info"}).output;
    EXPECT_THAT(info, HasSubstr("pemaro.TouchService                      running\n"));
    EXPECT_THAT(info, HasSubstr("  packetSize         4096\n"));
    EXPECT_THAT(info, HasSubstr("  configuration      gain=2.5\n"));
    EXPECT_THAT(info, HasSubstr("  properties         sessions=2\n"));
    EXPECT_THAT(info, HasSubstr("  features           1 2 3 (enabled) 4\n"));
    const std::string object = zelkctl({"info", "--json"}).output;
    EXPECT_THAT(object, HasSubstr("\"gain\":2.5,"));
    EXPECT_THAT(object, HasSubstr("{\"feature\":3,\"enabled\":true}"));
    EXPECT_EQ(1u, splitLines(object).size());
}

// No interface tells them; the simulated stack does.
TEST(Settings, OfTheManagersAreShown) {
    TouchStack stack({"--gesture-rate", "0", "--hand-rate", "0"});
    expectRows({{{"gesture", "wakeup", "on"}, 0, "wake-up on\n"},
                {{"hand", "security", "2"}, 0, "security level 2\n"}});
    const std::string info = zelkctl({"info"}).output;
    for (const char* line :
         {"  gestures           detection=off\n", "  gestures           wakeup=on\n",
          "  hands              activity=idle\n", "  hands              wakeup=off\n",
          "  hands              security=2\n"}) {
        EXPECT_THAT(info, HasSubstr(line));
    }
    const std::string object = zelkctl({"info", "--json"}).output;
    EXPECT_THAT(object, HasSubstr("\"gestures\":{\"detection\":false,\"wakeup\":true}"));
    EXPECT_THAT(object,
                HasSubstr("\"hands\":{\"activity\":\"idle\",\"wakeup\":false,\"security\":2}"));
    for (const Words& words : {Words{"gesture", "wakeup"}, Words{"gesture", "detect"},
                               Words{"hand", "wakeup"}, Words{"hand", "security"}}) {
        const RunResult help = zelkctl({words[0], words[1], "--help"});
        EXPECT_THAT(help.output, HasSubstr("No interface tells the setting in force"));
    }
}

TEST(Completion, OffersWhatTheServicesHave) {
    TouchStack stack;
    std::string parameters;
    for (const std::string& line : splitLines(zelkctl({"afe", "get"}).output)) {
        parameters += line.substr(0, line.find('=')) + "\n";
    }
    EXPECT_THAT(parameters, HasSubstr("frequency\n"));
    expectRows({
            {{"words", "PARAMETER"}, 0, parameters},
            {{"words", "SERVICE"}, 0, "companion\ntouch\ngesture\nhand\n"},
            {{"words", "PROPERTY"},
             0,
             "authenticated\nevents\nrecordFilter\nrollingLogSize\nsessions\n"},
    });
}

TEST(Settings, AreNotListedByAServiceThatHasNoWayTo) {
    TouchStack stack({"--fault", "sendCommand=status:0x40000005"});
    const std::string reason =
            ", and the service does not know the simulated stack's own request for it\n";
    expectRows({
            {{"config", "list"},
             1,
             "config list: Invalid command (0x40000005): the interface has no list of keys" +
                     reason},
            {{"config", "set", "gain=1"},
             1,
             "config set: Invalid command (0x40000005): the interface has no operation for one "
             "value" +
                     reason},
            {{"session", "list"},
             1,
             "session list: Invalid command (0x40000005): the interface has no list of sessions" +
                     reason},
    });
}

TEST(Info, TellsWhatIsNotRunning) {
    TouchStack stack({"--services", "hand"});
    const RunResult info = zelkctl({"info"});
    EXPECT_EQ(0, info.status);
    EXPECT_EQ(
            "pemaro.TouchService                      not running\n"
            "pemaro.TouchManagerService               not running\n"
            "pemaro.GestureManagerService             not running\n"
            "pemaro.HandBiometricManagerService       running\n"
            "  profiles           0\n"
            "  maxProfiles        5\n",
            info.output);
}

TEST(Watching, SaysThatNothingWillCome) {
    TouchStack stack({"--hand-rate", "50"});
    const struct {
        const char* manager;
        const char* note;
    } rows[] = {
            {"touch",
             "zelkctl: no feature is enabled, and nothing will be reported (zelkctl touch enable "
             "FEATURE)\n"},
            {"gesture",
             "zelkctl: detection and wake-up are off, and nothing will be reported (zelkctl "
             "gesture "
             "detect start)\n"},
            {"hand",
             "zelkctl: nothing goes on and wake-up is off, and nothing will be reported (zelkctl "
             "hand match)\n"},
    };
    for (const auto& row : rows) {
        const RunResult watch = zelkctl({row.manager, "watch", "--seconds", "0.1"});
        EXPECT_EQ(0, watch.status);
        EXPECT_EQ(row.note, watch.errors);
    }
    // What a watch began, it ends.
    EXPECT_EQ(0, zelkctl({"hand", "match", "-s", "0.2"}).status);
    EXPECT_EQ(0, zelkctl({"hand", "enroll", "-n", "2"}).status);
    EXPECT_EQ(0, zelkctl({"hand", "scan", "-n", "1"}).status);
    EXPECT_THAT(zelkctl({"command", "handstate"}).output, StartsWith("activity=idle\n"));
}

// ---- outputs ----

TEST(Output, ThatNobodyReadsEndsTheCommand) {
    TouchStack stack({"--rate", "200"});
    const std::string problem = "zelkctl: cannot write the standard output: ";
    const struct {
        const char* line;
        const char* reason;
    } rows[] = {
            {"set -o pipefail; zelkctl record | true", "Broken pipe"},
            {"set -o pipefail; zelkctl touch watch 2>/dev/null | true", nullptr},
            {"set -o pipefail; zelkctl command 'dump 262144' | head -c 10 >/dev/null",
             "Broken pipe"},
            {"zelkctl inspect >/dev/full", "No space left on device"},
            {"zelkctl record --frames 2 >/dev/full", "No space left on device"},
            {"zelkctl config get gain >&-", "Bad file descriptor"},
    };
    for (const auto& row : rows) {
        const RunResult result = runShell(row.line);
        EXPECT_EQ(1, result.status) << row.line;
        if (row.reason != nullptr) {
            EXPECT_THAT(result.errors, HasSubstr(problem + row.reason)) << row.line;
        }
    }
}

TEST(Output, OfDataLeavesTheWordsToTheErrors) {
    TouchStack stack({"--rate", "0"});
    Files files;
    const RunResult record = runShell("zelkctl record --frames 20 -o - >" + files.path("frames"));
    EXPECT_EQ(0, record.status);
    EXPECT_THAT(record.errors, HasSubstr("recorded 20 frames, "));
    EXPECT_EQ(20, countFrames(files.path("frames")));

    const RunResult dump = runShell("zelkctl config dump - >" + files.path("config"));
    EXPECT_THAT(dump.errors, HasSubstr("bytes written to the standard output\n"));
    EXPECT_THAT(files.read("config"), StartsWith("ZCFG"));

    // Whole frames, although the reader takes no more.
    runShell("zelkctl record -o - 2>/dev/null | head -c 40960 >" + files.path("cut"));
    EXPECT_EQ(40960u, files.read("cut").size());
}

TEST(Output, ToWhatIsNoFileLeavesItWhatItIs) {
    TouchStack stack;
    Files files;
    ASSERT_EQ(0, mknod(files.path("null").c_str(), S_IFCHR | 0600, makedev(1, 3)));
    const std::string target = files.write("target", "old");
    ASSERT_EQ(0, chmod(target.c_str(), 0600));
    ASSERT_EQ(0, symlink(target.c_str(), files.path("link").c_str()));
    ASSERT_EQ(0, mkfifo(files.path("fifo").c_str(), 0600));
    for (const char* command : {"config dump", "record --frames 2 -o"}) {
        const std::string line = std::string("zelkctl ") + command + " ";
        EXPECT_EQ(0, runShell(line + files.path("null")).status) << command;
        EXPECT_EQ(static_cast<mode_t>(S_IFCHR), kindOf(files.path("null"))) << command;
        EXPECT_EQ(0, runShell(line + files.path("link")).status) << command;
        EXPECT_EQ(static_cast<mode_t>(S_IFLNK), kindOf(files.path("link"))) << command;
        EXPECT_GT(files.read("target").size(), 1000u) << command;
        const std::string reader = "cat " + files.path("fifo") + " >" + files.path("read");
        EXPECT_EQ(0, runShell(reader + " & " + line + files.path("fifo") + " && wait").status);
        EXPECT_EQ(static_cast<mode_t>(S_IFIFO), kindOf(files.path("fifo"))) << command;
        EXPECT_GT(files.read("read").size(), 1000u) << command;
    }
    struct stat info {};
    EXPECT_EQ(0, stat(target.c_str(), &info));
    EXPECT_EQ(0600u, info.st_mode & 07777);
}

TEST(Output, IsNotTouchedBeforeThereIsSomethingToWrite) {
    Files files;
    const std::string file = files.write("file", "precious");
    {
        TouchStack stack({"--services", "companion", "--fault", "startRecord=status:0x40000010"});
        EXPECT_EQ(1, zelkctl({"record", "-o", file}).status);
        EXPECT_EQ(3, zelkctl({"touch", "watch", "-o", file}).status);
        EXPECT_EQ(1, zelkctl({"record", "-o", files.path("new")}).status);
    }
    EXPECT_EQ("precious", files.read("file"));
    EXPECT_EQ("file\n", run({"ls", files.folder()}).output);
}

TEST(Output, OfTheServiceOnAFullDiskIsAFailure) {
    Files files;
    ASSERT_EQ(0, mount("tmpfs", files.folder().c_str(), "tmpfs", 0, "size=64k"));
    {
        TouchStack stack({"--rate", "500"});
        const RunResult record = zelkctl({"record-file", files.path("frames"), "--seconds", "0.5"});
        EXPECT_EQ(1, record.status);
        EXPECT_EQ("zelkctl: stopRecord: Error writing to file (0x40000004): " +
                          files.path("frames") + "\n",
                  record.errors);
    }
    umount2(files.folder().c_str(), MNT_DETACH);
}

// ---- an end in time ----

TEST(Timeout, GivesUpACallThatIsNotAnswered) {
    TouchStack stack({"--fault", "inspect=delay:20s", "--fault", "hand.scan=delay:20s"});
    const RunResult inspect = zelkctl({"inspect", "--timeout", "2"});
    EXPECT_EQ(4, inspect.status);
    EXPECT_EQ("zelkctl: inspect: no answer within 2 s\n", inspect.errors);
    const RunResult scan = zelkctl({"hand", "scan", "--timeout", "2", "--json"});
    EXPECT_EQ(4, scan.status);
    EXPECT_EQ("{\"error\":\"scan: no answer within 2 s\",\"exit\":4}\n", scan.errors);
    EXPECT_EQ(0, zelkctl({"packet-size", "--timeout", "20"}).status);
}

TEST(Terminals, ShowACallUntilItIsAnswered) {
    TouchStack touchStack;
    touchStack.process().signal(SIGSTOP);
    Terminal terminal("env TERM=vt100 " + binary("zelkctl") + " ping", 80, 20);
    EXPECT_TRUE(terminal.await([](const std::string& text) {
        return testing::Matches(MatchesRegex("[a-zA-Z]+: waiting for the answer, [0-9]+ s\n+"))(
                text);
    })) << terminal.text();
    touchStack.process().signal(SIGCONT);
    EXPECT_TRUE(terminal.awaitText("ended with 0")) << terminal.text();
    EXPECT_THAT(terminal.text(), Not(HasSubstr("waiting")));
}

TEST(Signals, EndACommandWhoseCallIsNotAnswered) {
    TouchStack stack({"--fault", "inspect=delay:20s"});
    for (const int number : {SIGINT, SIGTERM}) {
        ChildProcess command({binary("zelkctl"), "inspect"});
        ASSERT_TRUE(stack.awaitLine("client " + std::to_string(command.pid()) + " registered"));
        std::this_thread::sleep_for(std::chrono::milliseconds(500));
        command.signal(number);
        expectEndsSoon(command, 128 + number);
        EXPECT_EQ("zelkctl: interrupted: inspect was not answered, and may have been done or not\n",
                  command.errors());
    }
}

TEST(Signals, KeepWhatWasRecordedAlthoughTheServiceDoesNotAnswer) {
    Files files;
    TouchStack stack({"--rate", "200", "--fault", "stopRecord=delay:20s"});
    ChildProcess record({binary("zelkctl"), "record", "-o", files.path("frames")});
    ASSERT_TRUE(record.awaitOutput(" frames/s "));
    record.signal(SIGINT);
    expectEndsSoon(record, 128 + SIGINT);
    const std::vector<std::string> lines = splitLines(record.output());
    EXPECT_THAT(lines.back(), MatchesRegex("recorded [1-9][0-9]* frames, .*"));
    EXPECT_EQ(
            "zelkctl: the service was not told that the recording ends\n"
            "zelkctl: interrupted: stopRecord was not answered, and may have been done or not\n",
            record.errors());
    EXPECT_THAT(lines.back(),
                StartsWith("recorded " + std::to_string(countFrames(files.path("frames"))) + " "));
}

TEST(Signals, EndARecordingThatWaitsForAReader) {
    Files files;
    TouchStack stack;
    ASSERT_EQ(0, mkfifo(files.path("fifo").c_str(), 0600));
    ChildProcess record({binary("zelkctl"), "record", "-o", files.path("fifo")});
    ASSERT_TRUE(stack.process().awaitOutput(" registered"));
    std::this_thread::sleep_for(std::chrono::milliseconds(300));
    record.signal(SIGTERM);
    expectEndsSoon(record, 128 + SIGTERM);
    EXPECT_EQ("zelkctl: interrupted\n", record.errors());
    EXPECT_EQ(std::string::npos, stack.process().output().find(" records"));
}

// ---- the simulated stack ----

TEST(Stack, SurvivesARequestWithTextsAmongItsNumbers) {
    TouchStack stack;
    android::sp<TouchCompanionClient> client = new TouchCompanionClient();
    ASSERT_EQ(0, client->init());
    SerializableMap request;
    SerializableMap response;
    ASSERT_EQ(0, request.unserialize("{\"DEBUG_COMMAND\":{\"REQUEST\":{\"ACTION\":\"SEND_COMMAND\","
                                     "\"PARAMETERS\":{\"NUM_OF_ELEMENTS\":2,\"SEND_COMMAND_NAME\":"
                                     "\"calibrate\",\"VALUES\":[\"1,2\"]}}}}"));
    EXPECT_EQ(STATUS_ERROR_PARSING_PARAMETER, client->sendCommand(request, response));
    EXPECT_TRUE(stack.process().isRunning());
}

TEST(Stack, GoesOnWhenNobodyReadsWhatItTells) {
    const std::string line = binary("zelk-touchstack") +
                             " --services companion 2>&1 >/dev/full & pid=$!; sleep 1; " +
                             binary("zelkctl") + " ping; kill $pid; wait $pid; echo $?";
    EXPECT_EQ(
            "zelk-touchstack: cannot write the standard output: No space left on device; the "
            "services go on in silence\nthe service is alive\n1\n",
            run({"bash", "-c", line}).output);
}

}  // namespace pemaro::test
