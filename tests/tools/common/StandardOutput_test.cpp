// SPDX-License-Identifier: Apache-2.0
// The standard output of a process can fail once: each test runs in one of its own, which says on the
// standard error what became of it.
#include "tools/common/StandardOutput.h"

#include <fcntl.h>
#include <gtest/gtest.h>
#include <signal.h>
#include <unistd.h>

#include <chrono>
#include <string>
#include <thread>

using testing::ExitedWithCode;

namespace pemaro::tools {

namespace {

const std::string kProblem = "cannot write the standard output: ";

// The standard output becomes the end of a pipe; its other end.
int pipeOutput(int flags = 0) {
    int ends[2];
    EXPECT_EQ(0, pipe2(ends, flags));
    dup2(ends[1], STDOUT_FILENO);
    close(ends[1]);
    signal(SIGPIPE, SIG_IGN);
    return ends[0];
}

void sendOutputTo(const char* path) {
    dup2(open(path, O_WRONLY), STDOUT_FILENO);
}

// Ends the process with whether all went well, after a word about the output.
[[noreturn]] void leaveWith(bool good) {
    writeError(outputProblem().empty() ? "all was written" : outputProblem());
    _exit(good ? 0 : 1);
}

}  // namespace

TEST(StandardOutputDeathTest, IsWrittenWholeToASlowReader) {
    // Also where somebody else made the pipe one that does not wait.
    for (const int flags : {0, O_NONBLOCK}) {
        EXPECT_EXIT(
                {
                    const int reader = pipeOutput(flags);
                    const std::string text(1 << 20, 'a');
                    size_t got = 0;
                    std::thread thread([&] {
                        char piece[50000];
                        while (got < text.size()) {
                            const ssize_t size = read(reader, piece, sizeof(piece));
                            got += size > 0 ? static_cast<size_t>(size) : 0;
                            std::this_thread::sleep_for(std::chrono::milliseconds(1));
                        }
                    });
                    const bool written = writeOutput(text);
                    thread.join();
                    leaveWith(written && got == text.size());
                },
                ExitedWithCode(0), "^all was written\n$");
    }
}

TEST(StandardOutputDeathTest, KeepsItsFirstFailure) {
    EXPECT_EXIT(
            {
                sendOutputTo("/dev/full");
                const bool first = writeOutput("lost");
                noteOutputClosed();
                sendOutputTo("/dev/null");
                leaveWith(!first && !writeOutput("lost as well"));
            },
            ExitedWithCode(0), "^" + kProblem + "No space left on device\n$");
    EXPECT_EXIT(
            {
                close(pipeOutput());
                leaveWith(!writeOutput("lost"));
            },
            ExitedWithCode(0), "^" + kProblem + "Broken pipe\n$");
}

TEST(StandardOutputDeathTest, FailsWhenItsReaderIsKnownToBeGone) {
    EXPECT_EXIT(
            {
                noteOutputClosed();
                leaveWith(!writeOutput("nothing"));
            },
            ExitedWithCode(0), "^" + kProblem + "Broken pipe\n$");
}

TEST(StandardOutputDeathTest, IsGivenUpWhenItMustNotBeWaitedFor) {
    EXPECT_EXIT(
            {
                pipeOutput();
                // More than a pipe takes.
                tryWriteOutput(std::string(1 << 20, 'a'));
                leaveWith(true);
            },
            ExitedWithCode(0), "^" + kProblem + "Resource temporarily unavailable\n$");
    EXPECT_EXIT(
            {
                const int reader = pipeOutput();
                tryWriteOutput("the last words");
                char words[20];
                leaveWith(read(reader, words, sizeof(words)) == 14);
            },
            ExitedWithCode(0), "^all was written\n$");
}

TEST(StandardOutputDeathTest, ThatIsClosedCountsAsFailedAndTakesNoFilesPlace) {
    EXPECT_EXIT(
            {
                close(STDOUT_FILENO);
                openStandardStreams();
                // The next file that is opened is not taken for the standard output.
                const int file = open("/dev/zero", O_RDONLY);
                leaveWith(file > STDERR_FILENO && fcntl(STDOUT_FILENO, F_GETFD) >= 0 &&
                          !writeOutput("lost"));
            },
            ExitedWithCode(0), "^" + kProblem + "Bad file descriptor\n$");
    EXPECT_EXIT(
            {
                close(STDIN_FILENO);
                openStandardStreams();
                sendOutputTo("/dev/null");
                leaveWith(fcntl(STDIN_FILENO, F_GETFD) >= 0 && writeOutput("taken"));
            },
            ExitedWithCode(0), "^all was written\n$");
}

}  // namespace pemaro::tools
