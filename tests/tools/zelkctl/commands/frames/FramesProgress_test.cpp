// SPDX-License-Identifier: Apache-2.0
// What the programs show at a terminal while they take long to read a recording, or to make something of
// it. How long is in the hands of whoever is at the other end of a FIFO.

#include <fcntl.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <atomic>
#include <chrono>
#include <csignal>
#include <numeric>
#include <string>
#include <thread>
#include <vector>

#include "tests/support/Terminal.h"
#include "tests/tools/zelkctl/commands/frames/RecordingToLookInto.h"

using testing::HasSubstr;
using testing::MatchesRegex;
using testing::Not;

namespace pemaro::test {

namespace {

constexpr uint32_t kFrames = 3000;
constexpr std::chrono::milliseconds kPause(20);

class FramesProgress : public ::testing::Test {
  protected:
    FramesProgress() {
        // A reader that went away is no news here.
        signal(SIGPIPE, SIG_IGN);
        EXPECT_EQ(0, mkfifo(fifo.c_str(), 0600));
        std::vector<uint32_t> numbers(kFrames);
        std::iota(numbers.begin(), numbers.end(), 0);
        bytes = recordings.frames(numbers);
    }

    ~FramesProgress() override { signal(SIGPIPE, SIG_DFL); }

    static std::string command(const std::string& words) {
        return "env TERM=vt100 " ZELK_BIN_DIR "/zelkctl frames " + words;
    }

    // Writes the recording into the FIFO, slowly until `hurry`.
    void feed() const {
        const int fd = open(fifo.c_str(), O_WRONLY | O_CLOEXEC);
        const size_t piece = 2 * RecordingToLookInto::kLength;
        for (size_t at = 0; at < bytes.size(); at += piece) {
            if (write(fd, &bytes[at], std::min(piece, bytes.size() - at)) < 0) {
                break;
            }
            if (!hurry) {
                std::this_thread::sleep_for(kPause);
            }
        }
        close(fd);
    }

    // Reads what comes out of the FIFO, slowly until `hurry`.
    void drain() {
        const int fd = open(fifo.c_str(), O_RDONLY | O_CLOEXEC);
        char piece[4096];
        for (ssize_t got = 0; (got = read(fd, piece, sizeof(piece))) > 0;) {
            drained.append(piece, static_cast<size_t>(got));
            if (!hurry) {
                std::this_thread::sleep_for(kPause);
            }
        }
        close(fd);
    }

    RecordingToLookInto recordings;
    const std::string fifo = recordings.path("fifo");
    std::string bytes;
    std::string drained;
    std::atomic<bool> hurry{false};
};

}  // namespace

TEST_F(FramesProgress, IsShownWhileARecordingIsRead) {
    std::thread writer([this] { feed(); });
    Terminal terminal(command("stat " + fifo), 80, 20);
    EXPECT_TRUE(terminal.await([](const std::string& text) {
        return testing::Matches(MatchesRegex("reading: [1-9][0-9]* bytes\n+"))(text);
    })) << terminal.text();
    hurry = true;
    EXPECT_TRUE(terminal.awaitText("ended with 0"));
    writer.join();
    EXPECT_THAT(terminal.text(), HasSubstr("frames      3000 of 344 bytes\n"));
    EXPECT_THAT(terminal.text(), Not(HasSubstr("reading")));
}

TEST_F(FramesProgress, IsShownWhileARecordingIsMadeReadyToBePlayed) {
    std::thread writer([this] { feed(); });
    // With packets that are too short it is not played.
    Terminal terminal(
            "env TERM=vt100 " ZELK_BIN_DIR "/zelk-touchstack --frame-bytes 100 --replay " + fifo,
            80, 20);
    EXPECT_TRUE(terminal.await([](const std::string& text) {
        return testing::Matches(MatchesRegex("reading: [1-9][0-9]* bytes\n+"))(text);
    })) << terminal.text();
    hurry = true;
    EXPECT_TRUE(terminal.awaitText("ended with 1"));
    writer.join();
    EXPECT_THAT(terminal.text(), Not(HasSubstr("reading")));
}

TEST_F(FramesProgress, IsNotDrawnOnADumbTerminal) {
    std::thread writer([this] { feed(); });
    Terminal terminal("env TERM=dumb " ZELK_BIN_DIR "/zelkctl frames stat " + fifo, 80, 20);
    // Twice as long as it takes to be shown.
    std::this_thread::sleep_for(std::chrono::seconds(2));
    EXPECT_THAT(terminal.text(), MatchesRegex("\n+"));
    hurry = true;
    EXPECT_TRUE(terminal.awaitText("ended with 0"));
    writer.join();
}

TEST_F(FramesProgress, IsShownWhileFramesAreExported) {
    const std::string path = recordings.write("frames", bytes);
    std::thread reader([this] { drain(); });
    Terminal terminal(command("export " + path + " -f json -o " + fifo), 80, 20);
    EXPECT_TRUE(terminal.await([](const std::string& text) {
        return testing::Matches(
                MatchesRegex("exporting: [1-9][0-9]* of 3000 frames, [1-9][0-9]? %\n+"))(text);
    })) << terminal.text();
    hurry = true;
    EXPECT_TRUE(terminal.awaitText("ended with 0"));
    reader.join();
    EXPECT_THAT(terminal.text(), MatchesRegex("3000 frames in " + fifo + "\nended with 0\n+"));
    EXPECT_EQ(kFrames, splitLines(drained).size());
}

TEST_F(FramesProgress, EndsWithTheCommand) {
    std::thread writer([this] { feed(); });
    Terminal terminal(command("stat " + fifo), 80, 20);
    EXPECT_TRUE(terminal.awaitText("reading: "));
    terminal.interrupt();
    EXPECT_TRUE(terminal.awaitText("ended with 130")) << terminal.text();
    EXPECT_THAT(terminal.text(), HasSubstr("zelkctl: interrupted\nended with 130\n"));
    writer.join();
}

}  // namespace pemaro::test
