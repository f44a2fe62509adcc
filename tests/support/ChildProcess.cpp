// SPDX-License-Identifier: Apache-2.0
#include "tests/support/ChildProcess.h"

#include <fcntl.h>
#include <signal.h>
#include <sys/mman.h>
#include <sys/prctl.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

#include <sstream>
#include <thread>

namespace pemaro::test {

namespace {

using Clock = std::chrono::steady_clock;

constexpr std::chrono::milliseconds kPollPeriod(10);

int makeFile(const char* name) {
    return memfd_create(name, MFD_CLOEXEC);
}

// In the child between fork and exec, where little is allowed.
[[noreturn]] void become(char* const* arguments, int output, int errors) {
    prctl(PR_SET_PDEATHSIG, SIGKILL);
    sigset_t none;
    sigemptyset(&none);
    sigprocmask(SIG_SETMASK, &none, nullptr);
    const int input = open("/dev/null", O_RDONLY);
    dup2(input, STDIN_FILENO);
    dup2(output, STDOUT_FILENO);
    dup2(errors, STDERR_FILENO);
    execvp(arguments[0], arguments);
    _exit(ChildProcess::kNotRun);
}

}  // namespace

ChildProcess::ChildProcess(const std::vector<std::string>& arguments)
        : mOutput(makeFile("stdout")), mErrors(makeFile("stderr")) {
    std::vector<char*> pointers;
    for (const std::string& argument : arguments) {
        pointers.push_back(const_cast<char*>(argument.c_str()));
    }
    pointers.push_back(nullptr);
    mPid = fork();
    if (mPid == 0) {
        become(pointers.data(), mOutput, mErrors);
    }
}

ChildProcess::~ChildProcess() {
    if (isRunning()) {
        signal(SIGKILL);
        reap(0);
    }
    close(mOutput);
    close(mErrors);
}

bool ChildProcess::isRunning() {
    return !mEnded && !reap(WNOHANG);
}

void ChildProcess::signal(int number) {
    if (!mEnded) {
        kill(mPid, number);
    }
}

int ChildProcess::wait(std::chrono::seconds patience) {
    const Clock::time_point end = Clock::now() + patience;
    while (isRunning()) {
        if (Clock::now() > end) {
            signal(SIGKILL);
            reap(0);
            return kTimedOut;
        }
        std::this_thread::sleep_for(kPollPeriod);
    }
    return WIFEXITED(mStatus) ? WEXITSTATUS(mStatus) : 128 + WTERMSIG(mStatus);
}

bool ChildProcess::awaitOutput(const std::string& text, std::chrono::seconds patience) {
    const Clock::time_point end = Clock::now() + patience;
    while (true) {
        const bool running = isRunning();
        if (output().find(text) != std::string::npos) {
            return true;
        }
        if (!running || Clock::now() > end) {
            return false;
        }
        std::this_thread::sleep_for(kPollPeriod);
    }
}

bool ChildProcess::reap(int options) {
    mEnded = waitpid(mPid, &mStatus, options) == mPid;
    return mEnded;
}

std::string ChildProcess::contents(int file) {
    struct stat info {};
    fstat(file, &info);
    std::string text(static_cast<size_t>(info.st_size), '\0');
    const ssize_t size = pread(file, &text[0], text.size(), 0);
    text.resize(size > 0 ? static_cast<size_t>(size) : 0);
    return text;
}

RunResult run(const std::vector<std::string>& arguments, std::chrono::seconds patience) {
    ChildProcess child(arguments);
    const int status = child.wait(patience);
    return {status, child.output(), child.errors()};
}

std::vector<std::string> splitLines(const std::string& text) {
    std::vector<std::string> lines;
    std::istringstream stream(text);
    for (std::string line; std::getline(stream, line);) {
        lines.push_back(line);
    }
    return lines;
}

}  // namespace pemaro::test
