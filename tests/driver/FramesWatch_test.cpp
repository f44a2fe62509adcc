// SPDX-License-Identifier: Apache-2.0
// "zelkctl frames watch" in a terminal, which tmux plays, and without one.

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <signal.h>

#include <algorithm>
#include <chrono>
#include <functional>
#include <string>
#include <thread>

#include "tests/driver/CommandRows.h"
#include "tests/driver/DriverSetting.h"

using testing::HasSubstr;
using testing::MatchesRegex;

namespace pemaro::test {

namespace {

// A terminal in which zelkctl watches the frames, until it is let go.
class Terminal {
  public:
    // What the command's environment says, and how large the terminal is.
    Terminal(const std::string& environment, int columns, int rows) {
        const RunResult start = tmux({"new-session", "-d", "-x", std::to_string(columns), "-y",
                                      std::to_string(rows),
                                      "env " + environment + " " + binary("zelkctl") +
                                              " frames watch; echo ended with $?; sleep 1000"});
        EXPECT_EQ(0, start.status) << start.errors;
    }
    ~Terminal() { tmux({"kill-server"}); }

    // What stands there, with the escape sequences of colours or without.
    std::string text(bool withColors = false) {
        Words words = {"capture-pane", "-p"};
        if (withColors) {
            words.emplace_back("-e");
        }
        return tmux(words).output;
    }

    bool await(const std::function<bool(const std::string&)>& shows) {
        for (int i = 0; i < 600; ++i) {
            if (shows(text())) {
                return true;
            }
            std::this_thread::sleep_for(std::chrono::milliseconds(100));
        }
        return false;
    }

    bool awaitText(const std::string& part) {
        return await(
                [&part](const std::string& seen) { return seen.find(part) != std::string::npos; });
    }

    void resize(int columns, int rows) {
        tmux({"resize-window", "-x", std::to_string(columns), "-y", std::to_string(rows)});
    }

    void interrupt() { tmux({"send-keys", "C-c"}); }

  private:
    static RunResult tmux(Words words) {
        words.insert(words.begin(), {"tmux", "-f", "/dev/null", "-L", "frames-watch", "-u"});
        return run(words);
    }
};

// Fingers and a map of 33 columns and 61 rows.
Words stackOptions() {
    return {"--rate", "60", "--ring-frames", "512"};
}

const char* const kDensities = ":-=+*#%@";

}  // namespace

TEST(FramesWatch, DrawsTheFramesAndLeavesTheTerminalAsItWas) {
    TouchStack touchStack(stackOptions());
    Terminal terminal("TERM=vt100", 80, 40);
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
        Terminal terminal(row.environment, 80, 40);
        ASSERT_TRUE(terminal.awaitText("▀")) << terminal.text();
        EXPECT_THAT(terminal.text(true), HasSubstr(row.color));
    }
}

TEST(FramesWatch, FollowsTheSizeOfTheTerminal) {
    TouchStack touchStack(stackOptions());
    Terminal terminal("TERM=vt100", 80, 40);
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
