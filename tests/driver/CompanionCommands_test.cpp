// SPDX-License-Identifier: Apache-2.0
// zelkctl's commands for the touch companion against the simulated service: what they print and
// return, and what they leave behind.

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <signal.h>
#include <unistd.h>

#include <string>
#include <vector>

#include "pemaro/Version.h"
#include "tests/driver/CommandRows.h"
#include "tests/driver/DriverSetting.h"
#include "tests/driver/FrameCollector.h"

using testing::ContainsRegex;
using testing::HasSubstr;
using testing::MatchesRegex;
using testing::Not;

namespace pemaro::test {

namespace {

/// What a transaction carries, less what accompanies a configuration.
constexpr size_t kMaxConfigBytes = (1 << 20) - 2 * 4096 - 1024;

}  // namespace

TEST(CompanionCommands, OfTheDevice) {
    TouchStack stack;
    expectRows({
            {{"command", "calibrate 3 0x10"}, 0, "done\n"},
            {{"command", "status"}, 0, "filter=3 events=0 authenticated=no\n"},
            {{"command", "version", "--json"},
             0,
             "{\"answer\":\"zelk-touchstack " ZELK_VERSION "\"}\n"},
            {{"command", "selftest"},
             0,
             "configuration: intact\nanalog front end: 3 parameters\nselftest: passed\n"},
            {{"command", "dump 30"}, 0, "abcdefghijklmnopqrstuvwxyzabcd\n"},
            {{"command", "fail"}, 1, "sendCommand: Error involving AFE HAL (0x40000010): fail\n"},
            {{"command", "dance"}, 1, "sendCommand: Invalid command (0x40000005): dance\n"},
            {{"filter", "0x1f"}, 0, "record filter 0x1f\n"},
            {{"filter", "8"}, 0, "record filter 0x8\n"},
            {{"property", "set", "setRollingLogSize", "512"}, 0, "setRollingLogSize set to 512\n"},
            {{"property", "set", "setRollingLogSize", "-1"},
             1,
             "setProperty: Bad parameter (0x4000000D): setRollingLogSize\n"},
            {{"property", "set", "SetRollingLogSize", "512"},
             1,
             "setProperty: Invalid command (0x40000005): SetRollingLogSize\n"},
            {{"event", "7", "0xffffffff"}, 0, "event 7 with 4294967295 sent\n"},
            {{"event", "-7", "0"}, 0, "event -7 with 0 sent\n"},
            {{"inspect"}, 0, "0x00010002\n"},
            {{"inspect", "--json"}, 0, "{\"value\":65538}\n"},
            {{"packet-size"}, 0, "4096\n"},
            {{"packet-size", "--json"}, 0, "{\"packetSize\":4096}\n"},
            {{"auth", "guess"}, 1, "setAuth: Bad parameter (0x4000000D)\n"},
            {{"command", "factoryreset"},
             1,
             "sendCommand: Invalid state (0x4000000B): factoryreset\n"},
            {{"auth", "zelk"}, 0, "authenticated\n"},
            {{"command", "status"}, 0, "filter=8 events=2 authenticated=yes\n"},
            {{"command", "factoryreset"}, 0, "response success\n"},
            {{"command", "status"}, 0, "filter=3 events=2 authenticated=yes\n"},
    });
    EXPECT_TRUE(stack.awaitLine("event 7 with -1"));
    EXPECT_TRUE(stack.awaitLine("event -7 with 0"));
}

TEST(CompanionCommands, PrintsALongAnswerWhole) {
    TouchStack stack;
    const RunResult result = zelkctl({"command", "dump 262144"});
    EXPECT_EQ(0, result.status);
    ASSERT_EQ(262145u, result.output.size());
    EXPECT_EQ(0u, result.output.find("abcdefghijklmnopqrstuvwxyzabcd"));
}

TEST(CompanionCommands, SendsNothingOfWhatItRefuses) {
    TouchStack stack;
    Files files;
    const std::string large = files.write("large", std::string(kMaxConfigBytes + 1, '\0'));
    expectRows({
            {{"command", "calibrate 3 x"},
             2,
             "TEXT: 'x' is no number from -2147483648 to 4294967295 (--help tells more)\n"},
            {{"config", "load", large},
             1,
             "config load: Data size exceeds size of buffer (0x4000001A): " + large +
                     " has more than 1039360 bytes, the most that a transaction carries\n"},
    });
    EXPECT_THAT(stack.process().output(), Not(HasSubstr(" registered")));
}

TEST(CompanionCommands, ReadsValuesOfTheConfiguration) {
    TouchStack stack;
    expectRows({
            {{"config", "get", "gain"}, 0, "gain=1.500000\n"},
            {{"config", "get", "report.rate", "panel.size", "device.name", "edge.zones", "gain"},
             0,
             "report.rate=240\npanel.size={\"height\":2340,\"width\":1080}\n"
             "device.name=simulated touch panel\nedge.zones=[0,120,240]\ngain=1.500000\n"},
            {{"config", "get", "--json", "palm.rejection", "panel.size"},
             0,
             "{\"palm.rejection\":true,\"panel.size\":{\"height\":2340,\"width\":1080}}\n"},
            {{"config", "get", "[gain,volume]"},
             1,
             "getConfigParams: Not Found (0x40000019): [gain,volume]\n"},
            {{"config", "get", "gain", "volume"},
             1,
             "getConfigParams: Not Found (0x40000019): volume\n"},
    });
}

TEST(CompanionCommands, DumpsAndLoadsTheBinaryConfiguration) {
    TouchStack stack;
    Files files;
    const std::string first = files.path("first");
    const std::string second = files.path("second");
    const RunResult dump = zelkctl({"config", "dump", first});
    EXPECT_EQ("", dump.errors);
    const std::string binary = files.read("first");
    EXPECT_GT(binary.size(), 4000u);
    const std::string size = std::to_string(binary.size());
    EXPECT_EQ("configuration of " + size + " bytes written to " + first + "\n", dump.output);

    std::string corrupt = binary;
    corrupt.back() = static_cast<char>(corrupt.back() ^ 1);
    const std::string largest = files.write("largest", std::string(kMaxConfigBytes, '\0'));
    expectRows({
            {{"command", "calibrate 9"}, 0, "done\n"},
            {{"config", "load", files.write("corrupt", corrupt)},
             1,
             "setConfigParams: Corrupt data (0x4000001D): " + files.path("corrupt") + "\n"},
            {{"config", "load", files.write("empty", "")},
             1,
             "setConfigParams: Invalid format (0x4000000C): " + files.path("empty") + "\n"},
            // As much as a transaction carries reaches the service.
            {{"config", "load", largest},
             1,
             "setConfigParams: Invalid format (0x4000000C): " + largest + "\n"},
            {{"config", "dump", second},
             0,
             "configuration of " + size + " bytes written to " + second + "\n"},
    });
    EXPECT_NE(binary, files.read("second"));
    expectRows({
            {{"config", "load", first},
             0,
             "configuration of " + size + " bytes loaded from " + first + "\n"},
            {{"config", "dump", second},
             0,
             "configuration of " + size + " bytes written to " + second + "\n"},
            {{"config", "dump", "/no/such/file"},
             1,
             "config dump: Error opening file (0x40000001): /no/such/file: No such file or "
             "directory\n"},
    });
    EXPECT_EQ(binary, files.read("second"));
    EXPECT_EQ("corrupt\nempty\nfirst\nlargest\nsecond\n", run({"ls", files.folder()}).output);
}

TEST(CompanionCommands, MakesTheServiceReadAndWriteItsConfiguration) {
    Files files;
    const std::string own = files.path("own");
    const std::string other = files.write("other", "{\"gain\":2.5}");
    TouchStack stack({"--config-file", own});
    expectRows({
            {{"config", "reload", other}, 0, "configuration reloaded: " + other + "\n"},
            {{"config", "get", "gain"}, 0, "gain=2.5\n"},
            {{"config", "reload"}, 1, "reloadConfig: Error opening file (0x40000001)\n"},
            {{"config", "save"}, 0, "configuration saved\n"},
            {{"session", "save"}, 0, "session 1\n"},
            {{"config", "reload", files.write("third", "{\"gain\":3}")},
             0,
             "configuration reloaded: " + files.path("third") + "\n"},
            {{"session", "save", "--json"}, 0, "{\"session\":2}\n"},
            {{"config", "get", "gain"}, 0, "gain=3\n"},
            {{"session", "restore", "1"}, 0, "session 1 restored\n"},
            {{"config", "get", "gain"}, 0, "gain=2.5\n"},
            {{"session", "restore", "0x2"}, 0, "session 2 restored\n"},
            {{"config", "get", "gain"}, 0, "gain=3\n"},
            {{"session", "restore", "3"}, 1, "restoreSession: Not Found (0x40000019): session 3\n"},
            {{"config", "reload"}, 0, "configuration reloaded\n"},
            {{"config", "get", "gain"}, 0, "gain=2.5\n"},
            {{"config", "save", files.path("fourth")},
             0,
             "configuration saved: " + files.path("fourth") + "\n"},
            {{"config", "save", "/no/such/file"},
             1,
             "saveConfig: Error opening file (0x40000001): /no/such/file\n"},
            {{"config", "reload", "/no/such/file"},
             1,
             "reloadConfig: Error opening file (0x40000001): /no/such/file\n"},
    });
    EXPECT_EQ(files.read("own"), files.read("fourth"));
    EXPECT_THAT(files.read("own"), HasSubstr("\"gain\":2.5,"));
}

TEST(CompanionCommands, TellInOneLineThatTheServiceRefuses) {
    const std::vector<std::string> operations = {
            "sendCommand", "getConfigParams", "setConfigParams", "reloadConfig",
            "saveConfig",  "saveSession",     "restoreSession",  "sendEvent",
            "inspect",     "getPacketSize",   "setAuth",         "setRecordFile"};
    Words options;
    for (const std::string& operation : operations) {
        options.insert(options.end(), {"--fault", operation + "=status:0x40000009"});
    }
    TouchStack stack(options);
    Files files;
    const std::string file = files.write("file", "old");
    expectRows({
            {{"command", "status"}, 1, "sendCommand: Broken pipe (0x40000009): status\n"},
            {{"filter", "1"}, 1, "setRecordFilter: Broken pipe (0x40000009): record filter 0x1\n"},
            {{"property", "set", "setRollingLogSize", "1"},
             1,
             "setProperty: Broken pipe (0x40000009): setRollingLogSize\n"},
            {{"config", "get", "gain"}, 1, "getConfigParams: Broken pipe (0x40000009): gain\n"},
            // The binary form has no place for a status.
            {{"config", "dump", file},
             1,
             "getConfigParams: An unknown error has occurred (0x40000000)\n"},
            {{"config", "load", file},
             1,
             "setConfigParams: Broken pipe (0x40000009): " + file + "\n"},
            {{"config", "reload"}, 1, "reloadConfig: Broken pipe (0x40000009)\n"},
            {{"config", "save"}, 1, "saveConfig: Broken pipe (0x40000009)\n"},
            {{"session", "save"}, 1, "saveSession: Broken pipe (0x40000009)\n"},
            {{"session", "restore", "1"},
             1,
             "restoreSession: Broken pipe (0x40000009): session 1\n"},
            {{"event", "1", "2"}, 1, "sendEvent: Broken pipe (0x40000009): event 1 with 2\n"},
            {{"inspect"}, 1, "inspect: Broken pipe (0x40000009)\n"},
            {{"packet-size"}, 1, "getPacketSize: Broken pipe (0x40000009)\n"},
            {{"auth", "zelk"}, 1, "setAuth: Broken pipe (0x40000009)\n"},
            {{"record-file", file}, 1, "setRecordFile: Broken pipe (0x40000009): " + file + "\n"},
    });
    EXPECT_EQ("old", files.read("file"));
    EXPECT_EQ("file\n", run({"ls", files.folder()}).output);
}

TEST(CompanionCommands, TellInOneLineThatTheServiceIsNotThereOrDies) {
    const std::string absent = "the service pemaro.TouchService is not running\n";
    expectRows({
            {{"command", "status"}, 3, absent},
            {{"config", "get", "gain"}, 3, absent},
            {{"session", "save"}, 3, absent},
            {{"record-file", "/tmp/frames"}, 3, absent},
    });
    TouchStack stack({"--fault", "inspect=die"});
    expectRows({{{"inspect"}, 1, "inspect: An unknown error has occurred (0x40000000)\n"}});
}

TEST(RecordFile, MakesTheServiceRecordToAFile) {
    TouchStack stack({"--rate", "500"});
    Files files;
    const std::string file = files.path("frames");
    const RunResult record = zelkctl({"record-file", file, "--seconds", "0.5"});
    EXPECT_EQ(0, record.status);
    EXPECT_EQ("", record.errors);
    EXPECT_THAT(record.output,
                MatchesRegex("recording to " + file + "\nrecorded [0-9]+\\.[0-9] s\n"));
    EXPECT_GT(countFrames(file), 10);
}

TEST(RecordFile, EndsWhenInterrupted) {
    for (int signal : {SIGINT, SIGTERM}) {
        TouchStack stack({"--rate", "500"});
        Files files;
        ChildProcess record({binary("zelkctl"), "record-file", files.path("frames")});
        ASSERT_TRUE(record.awaitOutput("recording to "));
        usleep(100000);
        record.signal(signal);
        EXPECT_EQ(0, record.wait());
        EXPECT_THAT(record.output(), ContainsRegex("recorded [0-9.]+ s\n"));
        const std::string name = "client " + std::to_string(record.pid());
        EXPECT_TRUE(stack.process().awaitOutput(name + " stopped: "));
        EXPECT_GT(countFrames(files.path("frames")), 0);
    }
}

TEST(RecordFile, IsRefusedWhenTheServiceCannotWriteThere) {
    TouchStack stack;
    expectRows({
            {{"record-file", "/no/such/file"},
             1,
             "startRecord: Error opening file (0x40000001): /no/such/file\n"},
    });
}

TEST(RecordFile, ReportsTheDeathOfTheService) {
    TouchStack stack;
    Files files;
    ChildProcess record({binary("zelkctl"), "record-file", files.path("frames")});
    ASSERT_TRUE(record.awaitOutput("recording to "));
    stack.kill();
    EXPECT_EQ(3, record.wait());
    EXPECT_THAT(record.errors(), MatchesRegex("zelkctl: the service died after [0-9.]+ s\n"));
}

}  // namespace pemaro::test
