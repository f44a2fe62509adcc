// SPDX-License-Identifier: Apache-2.0
// "zelkctl frames watch" in a terminal, which tmux plays, and without one.

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <signal.h>

#include <algorithm>
#include <string>

#include "tests/driver/CommandRows.h"
#include "tests/driver/DriverSetting.h"
#include "tests/support/Terminal.h"

using testing::HasSubstr;
using testing::MatchesRegex;

namespace pemaro::test {

namespace {

// A terminal in which zelkctl watches the frames, until it is let go.
class WatchTerminal : public Terminal {
  public:
    // What the command's environment says, and how large the terminal is.
    WatchTerminal(const std::string& environment, int columns, int rows)
            : Terminal("env " + environment + " " + binary("zelkctl") + " frames watch", columns,
                       rows) {}
};

// Fingers and a map of 33 columns and 61 rows.
Words stackOptions() {
    return {"--rate", "60", "--ring-frames", "512"};
}

const char* const kDensities = ":-=+*#%@";

}  // namespace

TEST(FramesWatch, DrawsTheFramesAndLeavesTheTerminalAsItWas) {
    TouchStack touchStack(stackOptions());
    WatchTerminal terminal("TERM=vt100", 80, 40);
    ASSERT_TRUE(terminal.awaitText("finger 2 at ")) << terminal.text();
    const std::vector<std::string> lines = splitLines(terminal.text());
    ASSERT_EQ(40u, lines.size());
    EXPECT_THAT(lines[0],
                MatchesRegex("frame [0-9]+  [0-9.]+ frames/s  [0-9]+ lost in [0-9]+ gaps  "
                             "0 corrupt *"));
    // The map is 31 lines high, and each finger stands in the middle of what it presses.
    for (const char finger : {'0', '1', '2'}) {
        const auto line = std::find_if(lines.begin() + 1, lines.begin() + 32,
                                       [finger](const std::string& text) {
                                           return text.find(finger) != std::string::npos;
                                       });
        ASSERT_NE(lines.begin() + 32, line) << finger << "\n" << terminal.text();
        EXPECT_NE(std::string::npos, line->find_first_of(kDensities)) << *line;
        EXPECT_LT(line->find(finger), 33u);
    }
    EXPECT_THAT(lines[32], MatchesRegex("finger 0 at [0-9]+, [0-9]+  peak [0-9]+ +"
                                        "finger 1 at [0-9]+, [0-9]+  peak [0-9]+ *"));

    terminal.interrupt();
    ASSERT_TRUE(terminal.awaitText("ended with 0")) << terminal.text();
    EXPECT_THAT(terminal.text(), MatchesRegex("watched [0-9]+ frames, [0-9]+ lost in [0-9]+ gaps, "
                                              "0 corrupt\nended with 0\n+"));
}

TEST(FramesWatch, UsesTheColoursThatThereAre) {
    TouchStack touchStack(stackOptions());
    const struct {
        const char* environment;
        const char* color;
    } rows[] = {{"TERM=tmux-256color COLORTERM=truecolor LC_ALL=C.UTF-8", "\x1b[38;2;"},
                {"TERM=tmux-256color COLORTERM= LC_ALL=C.UTF-8", "\x1b[38;5;"}};
    for (const auto& row : rows) {
        WatchTerminal terminal(row.environment, 80, 40);
        ASSERT_TRUE(terminal.awaitText("▀")) << terminal.text();
        EXPECT_THAT(terminal.text(true), HasSubstr(row.color));
    }
}

TEST(FramesWatch, FollowsTheSizeOfTheTerminal) {
    TouchStack touchStack(stackOptions());
    WatchTerminal terminal("TERM=vt100", 80, 40);
    ASSERT_TRUE(terminal.awaitText("finger 2 at "));
    terminal.resize(60, 12);
    // One column of fingers, three lines of them at the bottom; the map has eight lines.
    EXPECT_TRUE(terminal.await([](const std::string& text) {
        const std::vector<std::string> lines = splitLines(text);
        return lines.size() == 12 && lines[11].find("finger 2 at ") == 0;
    })) << terminal.text();
    terminal.resize(30, 2);
    EXPECT_TRUE(terminal.await([](const std::string& text) {
        const std::vector<std::string> lines = splitLines(text);
        return lines.size() == 2 && lines[0].find("frame ") == 0 && lines[1].find("finger 0") == 0;
    })) << terminal.text();
    terminal.resize(80, 40);
    EXPECT_TRUE(terminal.awaitText("finger 1 at ")) << terminal.text();
}

TEST(FramesWatch, PrintsALineEachSecondWhereThereIsNoTerminal) {
    TouchStack touchStack(stackOptions());
    const RunResult watch = zelkctl({"frames", "watch", "--seconds", "2.5"});
    EXPECT_EQ(0, watch.status);
    EXPECT_EQ("", watch.errors);
    const std::vector<std::string> lines = splitLines(watch.output);
    ASSERT_GE(lines.size(), 2u);
    EXPECT_THAT(lines[0],
                MatchesRegex("frame [0-9]+  [0-9.]+ frames/s  [0-9]+ lost in [0-9]+ gaps  0 corrupt"
                             "(  finger [012] at [0-9]+, [0-9]+  peak [0-9]+){3}"));
    EXPECT_THAT(lines.back(), MatchesRegex("watched [0-9]+ frames, .*"));

    const RunResult json = zelkctl({"frames", "watch", "--seconds", "1.5", "--json"});
    EXPECT_EQ(0, json.status);
    EXPECT_THAT(
            json.output,
            MatchesRegex(
                    "\\{\"time\":[0-9.]+,\"frames\":[0-9]+,\"rate\":[0-9.]+,\"lost\":[0-9]+,"
                    "\"gaps\":[0-9]+,\"corrupt\":0,\"sequence\":[0-9]+,\"fingers\":\\["
                    "(\\{\"finger\":[012],\"x\":[0-9]+,\"y\":[0-9]+,\"peak\":[0-9]+\\},?){3}\\],"
                    "\"hottest\":[0-9]+\\}\n"));
}

TEST(FramesWatch, PrintsALineEachSecondToATerminalThatCannotBeDrawnOn) {
    TouchStack touchStack(stackOptions());
    WatchTerminal terminal("TERM=dumb", 250, 40);
    EXPECT_TRUE(terminal.await([](const std::string& text) {
        return testing::Matches(MatchesRegex("frame [^\n]*\nframe .*"))(text);
    })) << terminal.text();
    terminal.interrupt();
    EXPECT_TRUE(terminal.awaitText("ended with 0")) << terminal.text();
    EXPECT_THAT(terminal.text(),
                MatchesRegex("(frame [^\n]*\n)+.*watched [0-9]+ frames, .*\nended with 0\n+"));
}

TEST(FramesWatch, TellsWhenNothingComesAndWhenTheServiceDies) {
    // A recording of one frame, and then nothing.
    Files files;
    {
        TouchStack touchStack(stackOptions());
        ASSERT_EQ(0, zelkctl({"record", "--frames", "1", "--output", files.path("one")}).status);
    }
    TouchStack touchStack({"--replay", files.path("one")});
    ChildProcess watch({binary("zelkctl"), "frames", "watch"});
    EXPECT_TRUE(watch.awaitOutput("frame 0  nothing for 2 s  0 lost in 0 gaps  0 corrupt"))
            << watch.output();
    touchStack.kill();
    EXPECT_EQ(3, watch.wait());
    EXPECT_EQ("zelkctl: the service died after 1 frames\n", watch.errors());
}

}  // namespace pemaro::test
