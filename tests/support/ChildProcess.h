// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <sys/types.h>

#include <chrono>
#include <string>
#include <vector>

namespace pemaro::test {

/// A program that runs beside the test, with its output kept.
/// It never outlives the object, nor the test program.
///
///     ChildProcess touchStack({binary("zelk-touchstack"), "--rate", "100"});
///     ASSERT_TRUE(touchStack.awaitOutput("process "));
///     touchStack.signal(SIGTERM);
///     EXPECT_EQ(0, touchStack.wait());
class ChildProcess {
  public:
    /// The status of a program that could not be run, as the shell has it.
    static constexpr int kNotRun = 127;
    static constexpr int kTimedOut = -1;
    static constexpr std::chrono::seconds kPatience{60};

    /// The program, by its path or found in PATH, and its arguments.
    explicit ChildProcess(const std::vector<std::string>& arguments);

    /// Kills what still runs.
    ~ChildProcess();
    ChildProcess(const ChildProcess&) = delete;
    ChildProcess& operator=(const ChildProcess&) = delete;

    pid_t pid() const { return mPid; }
    bool isRunning();
    void signal(int number);

    /// The exit status, 128 + n for one that signal n ended, or kTimedOut, and then it is killed.
    int wait(std::chrono::seconds patience = kPatience);

    /// What it wrote so far to stdout and to stderr.
    std::string output() const { return contents(mOutput); }
    std::string errors() const { return contents(mErrors); }

    /// Waits until its output contains `text`; false when it ends, or takes too long, without that.
    bool awaitOutput(const std::string& text, std::chrono::seconds patience = kPatience);

  private:
    bool reap(int options);
    static std::string contents(int file);

    int mOutput;
    int mErrors;
    pid_t mPid;
    bool mEnded = false;
    int mStatus = 0;
};

/// How a program that was run to its end did.
struct RunResult {
    int status;
    std::string output;
    std::string errors;
};

RunResult run(const std::vector<std::string>& arguments,
              std::chrono::seconds patience = ChildProcess::kPatience);

/// The lines of a text, without their ends.
std::vector<std::string> splitLines(const std::string& text);

}  // namespace pemaro::test
