// SPDX-License-Identifier: Apache-2.0
// zelkctl against the simulated touch stack: what it prints, what it returns, what it leaves behind.

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <signal.h>
#include <stdlib.h>
#include <sys/mount.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cstring>
#include <fstream>
#include <iterator>
#include <string>
#include <vector>

#include "simulator/Frame.h"
#include "tests/driver/DriverSetting.h"

using testing::HasSubstr;
using testing::MatchesRegex;

namespace pemaro::test {

namespace {

RunResult zelkctl(std::vector<std::string> arguments) {
    arguments.insert(arguments.begin(), binary("zelkctl"));
    return run(arguments);
}

std::string lastLine(const std::string& text) {
    const std::vector<std::string> lines = splitLines(text);
    return lines.empty() ? "" : lines.back();
}

off_t fileSize(const std::string& path) {
    struct stat info {};
    return stat(path.c_str(), &info) == 0 ? info.st_size : -1;
}

// The number of whole and intact frames in a file, or -1 when there is anything else in it.
int countFrames(const std::string& path) {
    std::ifstream file(path, std::ios::binary);
    const std::string recorded{std::istreambuf_iterator<char>(file), {}};
    int count = 0;
    for (size_t start = 0; start < recorded.size(); ++count) {
        simulator::FrameHeader header{};
        if (!simulator::readFrameHeader(&recorded[start], recorded.size() - start, &header) ||
            header.length > recorded.size() - start ||
            simulator::frameFault(&recorded[start], header.length) != nullptr) {
            return -1;
        }
        start += header.length;
    }
    return count;
}

// A folder that is gone, with all that it holds, when the test ends.
class Folder {
  public:
    Folder() { EXPECT_NE(nullptr, mkdtemp(&mPath[0])); }
    ~Folder() {
        umount2(mPath.c_str(), MNT_DETACH);
        run({"rm", "-rf", mPath});
    }

    std::string file(const std::string& name) const { return mPath + "/" + name; }

    void mountTinyDisk() {
        ASSERT_EQ(0, mount("tmpfs", mPath.c_str(), "tmpfs", 0, "size=64k")) << strerror(errno);
    }

  private:
    std::string mPath = "/tmp/zelkctl.XXXXXX";
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
        EXPECT_EQ(1, result.status);
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
    Folder folder;
    TouchStack touchStack({"--rate", "0", "--frame-bytes", "1000"});
    const RunResult record =
            zelkctl({"record", "--frames", "300", "--output", folder.file("frames")});
    EXPECT_EQ(0, record.status);
    EXPECT_EQ("", record.errors);
    EXPECT_THAT(lastLine(record.output),
                MatchesRegex("recorded 300 frames, [0-9]+ bytes in [0-9.]+ s, [0-9.]+ frames/s, "
                             "0 lost in 0 gaps, 0 corrupt"));
    EXPECT_THAT(record.output,
                HasSubstr(" " + std::to_string(fileSize(folder.file("frames"))) + " bytes in "));
    EXPECT_EQ(300, countFrames(folder.file("frames")));
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
        Folder folder;
        TouchStack touchStack({"--rate", "200"});
        ChildProcess record({binary("zelkctl"), "record", "--output", folder.file("frames")});
        ASSERT_TRUE(record.awaitOutput(" frames/s "));
        record.signal(signal);
        EXPECT_EQ(0, record.wait());
        EXPECT_EQ("", record.errors());
        EXPECT_THAT(lastLine(record.output()), MatchesRegex("recorded [1-9][0-9]* frames, .*"));
        const std::string name = "client " + std::to_string(record.pid());
        EXPECT_TRUE(touchStack.process().awaitOutput(name + " stopped: "));
        EXPECT_TRUE(touchStack.awaitLine(name + " unregistered"));
        EXPECT_GT(countFrames(folder.file("frames")), 0);
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

TEST(Zelkctl, StopsTheRecordingWhenTheDiskIsFull) {
    Folder folder;
    ASSERT_NO_FATAL_FAILURE(folder.mountTinyDisk());
    TouchStack touchStack({"--rate", "0", "--frame-bytes", "5000"});
    ChildProcess record({binary("zelkctl"), "record", "--output", folder.file("frames")});
    EXPECT_EQ(1, record.wait());
    const int whole = countFrames(folder.file("frames"));
    EXPECT_EQ(13, whole);  // 64 KiB
    EXPECT_EQ("zelkctl: cannot write " + folder.file("frames") +
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
    EXPECT_EQ(1, record.wait());
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
        ::testing::Values(Refusal{"open=status:0x4000000A",
                                  "zelkctl: init: Error attempting to acquire resource\n"},
                          Refusal{"getPacketSize=status:0x40000007",
                                  "zelkctl: getPacketSize: Invalid packet size\n"},
                          Refusal{"getPacketSize=status:0",
                                  "zelkctl: the service tells a packet size of 0 bytes\n"},
                          Refusal{"setRecordParameter=status:0x4000000E",
                                  "zelkctl: setRecordOutput: Action/command is unsupported\n"},
                          Refusal{"getCblk=null",
                                  "zelkctl: startRecord: Error attempting to acquire resource\n"},
                          Refusal{"startRecord=status:0x40000010",
                                  "zelkctl: startRecord: Error involving AFE HAL\n"},
                          Refusal{"stopRecord=status:0x40000015",
                                  "zelkctl: stopRecord: Timeout has occurred\n"},
                          Refusal{"startRecord=die",
                                  "zelkctl: startRecord: An unknown error has occurred\n"}));

}  // namespace pemaro::test
