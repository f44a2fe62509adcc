// SPDX-License-Identifier: Apache-2.0
// zelkctl against the simulated touch stack: what it prints, what it returns, what it leaves behind.

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <signal.h>
#include <sys/mount.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <cstring>
#include <string>
#include <vector>

#include "tests/driver/CommandRows.h"
#include "tests/driver/DriverSetting.h"
#include "tests/driver/FrameCollector.h"

using testing::HasSubstr;
using testing::MatchesRegex;

namespace pemaro::test {

namespace {

std::string lastLine(const std::string& text) {
    const std::vector<std::string> lines = splitLines(text);
    return lines.empty() ? "" : lines.back();
}

off_t fileSize(const std::string& path) {
    struct stat info {};
    return stat(path.c_str(), &info) == 0 ? info.st_size : -1;
}

// Files on a disk of 64 KiB.
class TinyDisk : public Files {
  public:
    TinyDisk() {
        EXPECT_EQ(0, mount("tmpfs", folder().c_str(), "tmpfs", 0, "size=64k")) << strerror(errno);
    }
    ~TinyDisk() { umount2(folder().c_str(), MNT_DETACH); }
};

}  // namespace

TEST(Zelkctl, PingsTheService) {
    TouchStack touchStack;
    const RunResult ping = zelkctl({"ping"});
    EXPECT_EQ(0, ping.status);
    EXPECT_EQ("the service is alive\n", ping.output);
    EXPECT_EQ("", ping.errors);
}

TEST(Zelkctl, TellsAtOnceThatThereIsNoService) {
    for (const char* command : {"ping", "record"}) {
        const RunResult result = zelkctl({command});
        EXPECT_EQ(3, result.status);
        EXPECT_EQ("", result.output);
        EXPECT_EQ("zelkctl: the service pemaro.TouchService is not running\n", result.errors);
    }
}

TEST(Zelkctl, ShowsTheLogOnRequest) {
    TouchStack touchStack;
    const RunResult ping = zelkctl({"--log", "ping"});
    EXPECT_EQ(0, ping.status);
    EXPECT_EQ("the service is alive\n", ping.output);
    EXPECT_THAT(ping.errors, HasSubstr("Bp::open"));
    EXPECT_THAT(ping.errors, HasSubstr("Init successfully"));
}

TEST(Zelkctl, RecordsTheFramesAskedFor) {
    Files folder;
    TouchStack touchStack({"--rate", "0", "--frame-bytes", "1000"});
    const RunResult record =
            zelkctl({"record", "--frames", "300", "--output", folder.path("frames")});
    EXPECT_EQ(0, record.status);
    EXPECT_EQ("", record.errors);
    EXPECT_THAT(lastLine(record.output),
                MatchesRegex("recorded 300 frames, [0-9]+ bytes in [0-9.]+ s, [0-9.]+ frames/s, "
                             "0 lost in 0 gaps, 0 corrupt"));
    EXPECT_THAT(record.output,
                HasSubstr(" " + std::to_string(fileSize(folder.path("frames"))) + " bytes in "));
    EXPECT_EQ(300, countFrames(folder.path("frames")));
    EXPECT_TRUE(touchStack.process().awaitOutput(" stopped: "));
}

TEST(Zelkctl, RecordsForTheSecondsAskedFor) {
    TouchStack touchStack({"--rate", "100", "--ring-frames", "512"});
    const RunResult record = zelkctl({"record", "--seconds", "1.5"});
    EXPECT_EQ(0, record.status);
    const std::vector<std::string> lines = splitLines(record.output);
    ASSERT_GE(lines.size(), 2u);
    EXPECT_THAT(lines.front(), MatchesRegex(" +[0-9.]+ s  [0-9]+ frames  [0-9.]+ frames/s  "
                                            "[0-9]+ bytes  0 lost in 0 gaps"));
    EXPECT_THAT(lines.back(), MatchesRegex("recorded [0-9]+ frames, .*"));
}

TEST(Zelkctl, StopsTheRecordingWhenInterrupted) {
    for (int signal : {SIGINT, SIGTERM}) {
        Files folder;
        TouchStack touchStack({"--rate", "200"});
        ChildProcess record({binary("zelkctl"), "record", "--output", folder.path("frames")});
        ASSERT_TRUE(record.awaitOutput(" frames/s "));
        record.signal(signal);
        EXPECT_EQ(0, record.wait());
        EXPECT_EQ("", record.errors());
        EXPECT_THAT(lastLine(record.output()), MatchesRegex("recorded [1-9][0-9]* frames, .*"));
        const std::string name = "client " + std::to_string(record.pid());
        EXPECT_TRUE(touchStack.process().awaitOutput(name + " stopped: "));
        EXPECT_TRUE(touchStack.awaitLine(name + " unregistered"));
        EXPECT_GT(countFrames(folder.path("frames")), 0);
    }
}

TEST(Zelkctl, FindsAnUnwritableOutputBeforeItRecords) {
    TouchStack touchStack;
    const RunResult record = zelkctl({"record", "--output", "/no/such/folder/frames"});
    EXPECT_EQ(1, record.status);
    EXPECT_EQ("", record.output);
    EXPECT_EQ("zelkctl: cannot open /no/such/folder/frames: No such file or directory\n",
              record.errors);
    EXPECT_EQ(std::string::npos, touchStack.process().output().find(" records"));
}

TEST(Zelkctl, RefusesAFileThatIsBeingRecordedTo) {
    Files folder;
    TouchStack touchStack({"--rate", "200"});
    const std::string path = folder.path("frames");
    ChildProcess record({binary("zelkctl"), "record", "--output", path});
    ASSERT_TRUE(record.awaitOutput(" frames/s "));
    const RunResult second = zelkctl({"record", "--frames", "5", "--output", path});
    EXPECT_EQ(1, second.status);
    EXPECT_EQ("", second.output);
    EXPECT_EQ("zelkctl: cannot open " + path + ": somebody else is writing to it\n", second.errors);
    record.signal(SIGINT);
    EXPECT_EQ(0, record.wait());
    EXPECT_THAT(lastLine(record.output()),
                MatchesRegex("recorded " + std::to_string(countFrames(path)) + " frames, .*"));
    EXPECT_EQ(0, zelkctl({"record", "--frames", "5", "--output", path}).status);
    EXPECT_EQ(5, countFrames(path));
}

TEST(Zelkctl, AddsARecordingToWhatItsDescriptorLeadsTo) {
    Files folder;
    TouchStack touchStack({"--rate", "200"});
    const std::string path = folder.path("frames");
    for (const char* output : {"/dev/stdout", "/dev/fd/1", "-"}) {
        const RunResult both = run(
                {"bash", "-c", R"({ "$0" record -n 5 -o "$1" && "$0" record -n 7 -o "$1"; } >"$2")",
                 binary("zelkctl"), output, path});
        EXPECT_EQ(0, both.status) << output;
        EXPECT_THAT(both.errors, HasSubstr("recorded 7 frames, "));
        EXPECT_EQ(12, countFrames(path)) << output;
    }
}

TEST(Zelkctl, StopsTheRecordingWhenTheDiskIsFull) {
    TinyDisk folder;
    TouchStack touchStack({"--rate", "0", "--frame-bytes", "5000"});
    ChildProcess record({binary("zelkctl"), "record", "--output", folder.path("frames")});
    EXPECT_EQ(1, record.wait());
    const int whole = countFrames(folder.path("frames"));
    EXPECT_EQ(13, whole);  // 64 KiB
    EXPECT_EQ("zelkctl: cannot write " + folder.path("frames") +
                      ": No space left on device (it holds 13 whole frames)\n",
              record.errors());
    const std::string name = "client " + std::to_string(record.pid());
    EXPECT_TRUE(touchStack.process().awaitOutput(name + " stopped: "));
    EXPECT_TRUE(touchStack.awaitLine(name + " unregistered"));
}

TEST(Zelkctl, ReportsFramesThatTheRingHadNoRoomFor) {
    // A ring of one frame is read once in 16 ms, far too slowly.
    TouchStack touchStack({"--rate", "1000", "--ring-frames", "1"});
    const RunResult record = zelkctl({"record", "--frames", "20"});
    EXPECT_EQ(0, record.status);
    EXPECT_THAT(lastLine(record.output),
                MatchesRegex("recorded 20 frames, .*, [1-9][0-9]* lost in [1-9][0-9]* gaps, "
                             "0 corrupt"));
}

TEST(Zelkctl, ReportsTheDeathOfTheService) {
    TouchStack touchStack({"--rate", "200"});
    ChildProcess record({binary("zelkctl"), "record"});
    ASSERT_TRUE(record.awaitOutput(" frames/s "));
    touchStack.kill();
    EXPECT_EQ(3, record.wait());
    EXPECT_THAT(record.errors(), MatchesRegex("zelkctl: the service died after [0-9]+ frames\n"));
    EXPECT_THAT(lastLine(record.output()), MatchesRegex("recorded [0-9]+ frames, .*"));
}

namespace {

struct Refusal {
    const char* fault;
    const char* line;
};

class ZelkctlRefusal : public ::testing::TestWithParam<Refusal> {};

}  // namespace

TEST_P(ZelkctlRefusal, IsTheStatusInOneLine) {
    TouchStack touchStack({"--fault", GetParam().fault});
    const RunResult record = zelkctl({"record", "--frames", "5"});
    EXPECT_EQ(1, record.status);
    EXPECT_EQ(GetParam().line, record.errors);
}

INSTANTIATE_TEST_SUITE_P(
        All, ZelkctlRefusal,
        ::testing::Values(
                Refusal{"open=status:0x4000000A",
                        "zelkctl: init: Error attempting to acquire resource (0x4000000A)\n"},
                Refusal{"getPacketSize=status:0x40000007",
                        "zelkctl: getPacketSize: Invalid packet size (0x40000007)\n"},
                Refusal{"getPacketSize=status:0",
                        "zelkctl: the service tells a packet size of 0 bytes\n"},
                Refusal{"setRecordParameter=status:0x4000000E",
                        "zelkctl: setRecordOutput: Action/command is unsupported (0x4000000E)\n"},
                Refusal{"getCblk=null",
                        "zelkctl: startRecord: Error attempting to acquire resource "
                        "(0x4000000A)\n"},
                Refusal{"startRecord=status:0x40000010",
                        "zelkctl: startRecord: Error involving AFE HAL (0x40000010)\n"},
                Refusal{"stopRecord=status:0x40000015",
                        "zelkctl: stopRecord: Timeout has occurred (0x40000015)\n"},
                Refusal{"startRecord=die",
                        "zelkctl: startRecord: An unknown error has occurred (0x40000000)\n"}));

}  // namespace pemaro::test
