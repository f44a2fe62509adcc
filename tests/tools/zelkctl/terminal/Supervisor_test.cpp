// SPDX-License-Identifier: Apache-2.0
// How a command ends under supervision. Each runs in a process of its own, which it ends.
#include "tools/zelkctl/terminal/Supervisor.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <signal.h>
#include <unistd.h>

#include <chrono>
#include <functional>
#include <string>
#include <thread>

#include "tests/support/Paper.h"
#include "tests/support/Sanitizers.h"
#include "tools/common/ExitStatus.h"
#include "tools/common/StandardOutput.h"
#include "tools/zelkctl/terminal/Output.h"
#include "tools/zelkctl/terminal/Settings.h"

using testing::ExitedWithCode;
using testing::MatchesRegex;

#ifdef ZELK_THREAD_SANITIZER
// A process that ends while threads are at work would be kept for a second, for races to show: too long for
// what is to end at once.
extern "C" const char* __tsan_default_options() {
    return "atexit_sleep_ms=0";
}
#endif

namespace pemaro::zelkctl {

namespace {

using Clock = std::chrono::steady_clock;

constexpr int kInterrupted = tools::kExitSignal + SIGINT;

[[noreturn]] void superviseAndExit(const std::function<int()>& command, double callTimeout = 0) {
    _exit(supervise(command, callTimeout));
}

void sendSelf(int signal) {
    kill(getpid(), signal);
}

[[noreturn]] void hang() {
    while (true) {
        pause();
    }
}

int awaitStop() {
    while (!mustStop()) {
        std::this_thread::sleep_for(std::chrono::milliseconds(5));
    }
    return failStopped();
}

// The standard output becomes a pipe that nobody reads.
void closeOutput() {
    int ends[2];
    EXPECT_EQ(0, pipe(ends));
    dup2(ends[1], STDOUT_FILENO);
    close(ends[1]);
    close(ends[0]);
    signal(SIGPIPE, SIG_IGN);
}

}  // namespace

TEST(SupervisorDeathTest, PassesOnWhatTheCommandReturned) {
    EXPECT_EXIT(superviseAndExit([] { return 0; }), ExitedWithCode(0), "^$");
    EXPECT_EXIT(superviseAndExit([] { return 7; }), ExitedWithCode(7), "^$");
}

TEST(SupervisorDeathTest, AsksTheCommandToStopAtASignal) {
    for (const int signal : {SIGINT, SIGTERM, SIGHUP}) {
        EXPECT_EXIT(superviseAndExit([signal] {
                        sendSelf(signal);
                        return awaitStop();
                    }),
                    ExitedWithCode(tools::kExitSignal + signal), "^zelkctl: interrupted\n$");
    }
    // A command that is done all the same was not interrupted.
    EXPECT_EXIT(superviseAndExit([] {
                    sendSelf(SIGINT);
                    while (!mustStop()) {
                        std::this_thread::yield();
                    }
                    return 0;
                }),
                ExitedWithCode(0), "^$");
}

TEST(SupervisorDeathTest, HearsASignalThatAShellHadIgnored) {
    EXPECT_EXIT(
            {
                signal(SIGINT, SIG_IGN);
                superviseAndExit([] {
                    sendSelf(SIGINT);
                    return awaitStop();
                });
            },
            ExitedWithCode(kInterrupted), "^zelkctl: interrupted\n$");
}

TEST(SupervisorDeathTest, EndsACommandThatDoesNotStop) {
    EXPECT_EXIT(superviseAndExit([]() -> int {
                    const LastWords outer([] { tools::writeError("outer words"); });
                    {
                        const LastWords gone([] { tools::writeError("words of before"); });
                    }
                    const LastWords inner([] { tools::writeError("inner words"); });
                    sendSelf(SIGTERM);
                    hang();
                }),
                ExitedWithCode(tools::kExitSignal + SIGTERM),
                "^inner words\nouter words\nzelkctl: interrupted\n$");
}

TEST(SupervisorDeathTest, TellsWhatACommandThatDoesNotStopWaitsFor) {
    EXPECT_EXIT(superviseAndExit([]() -> int {
                    const Waiting waiting("while waiting for a reader of fifo");
                    sendSelf(SIGINT);
                    hang();
                }),
                ExitedWithCode(kInterrupted),
                "^zelkctl: interrupted while waiting for a reader of fifo\n$");
    EXPECT_EXIT(
            superviseAndExit([]() -> int {
                const Waiting waiting("while waiting for a reader of fifo");
                return call("openDoor", []() -> int {
                    sendSelf(SIGINT);
                    hang();
                });
            }),
            ExitedWithCode(kInterrupted),
            "^zelkctl: interrupted: openDoor was not answered, and may have been done or not\n$");
}

TEST(SupervisorDeathTest, EndsItAtOnceWhenTheSignalComesAgain) {
    // The first signal alone takes at least so long; a machine that is very busy gets more chances.
    constexpr std::chrono::milliseconds kGrace(800);
    int quick = 0;
    for (int i = 0; i < 10 && quick == 0; ++i) {
        const Clock::time_point start = Clock::now();
        EXPECT_EXIT(superviseAndExit([]() -> int {
                        sendSelf(SIGINT);
                        while (!mustStop()) {
                            std::this_thread::yield();
                        }
                        sendSelf(SIGINT);
                        hang();
                    }),
                    ExitedWithCode(kInterrupted), "^zelkctl: interrupted\n$");
        quick += Clock::now() - start < kGrace ? 1 : 0;
    }
    EXPECT_EQ(1, quick);
}

TEST(SupervisorDeathTest, GivesACallUpThatTakesTooLong) {
    EXPECT_EXIT(superviseAndExit([] { return call("openDoor", []() -> int { hang(); }); }, 0.05),
                ExitedWithCode(tools::kExitTimeout),
                "^zelkctl: openDoor: no answer within 0.05 s\n$");
    // Other waits, and calls that are answered, are not limited by it.
    EXPECT_EXIT(superviseAndExit(
                        [] {
                            const Waiting waiting("for something else");
                            std::this_thread::sleep_for(std::chrono::milliseconds(300));
                            return call("openDoor", [] { return 5; });
                        },
                        0.05),
                ExitedWithCode(5), "^$");
}

TEST(SupervisorDeathTest, ShowsACallThatTakesLongOnATerminal) {
    const std::string shown = "(\ropenDoor: waiting for the answer, [0-9]+ s\x1b\\[K)+";
    const std::string gone = "\r\x1b\\[K";
    const auto takes = [](int tenths) {
        return [tenths] {
            return call("openDoor", [tenths] {
                std::this_thread::sleep_for(std::chrono::milliseconds(100 * tenths));
                return 5;
            });
        };
    };
    const auto isHeard = [] {
        return call("openDoor", [] {
            std::this_thread::sleep_for(std::chrono::seconds(2));
            note("news");
            return 5;
        });
    };
    const struct {
        const char* what;
        const char* term;
        bool json;
        double timeout;
        std::function<int()> command;
        int status;
        std::string text;
    } rows[] = {
            {"a long one", "vt100", false, 0, takes(20), 5, shown + gone},
            {"one that is given up", "vt100", false, 2, takes(100), tools::kExitTimeout,
             shown + gone + "zelkctl: openDoor: no answer within 2 s\r\n"},
            {"one with other words", "vt100", false, 0, isHeard, 5,
             shown + gone + "zelkctl: news\r\n(" + shown + gone + ")?"},
            {"a short one", "vt100", false, 0, takes(1), 5, ""},
            {"on a dumb terminal", "dumb", false, 0, takes(15), 5, ""},
            {"for a program", "vt100", true, 0, takes(15), 5, ""},
    };
    for (const auto& row : rows) {
        const test::Term term(row.term);
        const test::Paper paper(80);
        EXPECT_EXIT(
                {
                    dup2(paper.fd, STDERR_FILENO);
                    settings().json = row.json;
                    superviseAndExit(row.command, row.timeout);
                },
                ExitedWithCode(row.status), "^$")
                << row.what;
        EXPECT_THAT(paper.text(), MatchesRegex(row.text)) << row.what;
    }
}

TEST(SupervisorDeathTest, AsksTheCommandToStopWhenNobodyReadsItsOutput) {
    EXPECT_EXIT(
            {
                closeOutput();
                superviseAndExit(awaitStop);
            },
            ExitedWithCode(1), "^zelkctl: cannot write the standard output: Broken pipe\n$");
    // What a command makes nothing of is a failure all the same.
    EXPECT_EXIT(
            {
                closeOutput();
                superviseAndExit([] {
                    tools::writeOutput("lost");
                    return 0;
                });
            },
            ExitedWithCode(1), "^zelkctl: cannot write the standard output: Broken pipe\n$");
}

}  // namespace pemaro::zelkctl
