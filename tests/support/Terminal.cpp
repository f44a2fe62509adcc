// SPDX-License-Identifier: Apache-2.0
#include "tests/support/Terminal.h"

#include <gtest/gtest.h>
#include <unistd.h>

#include <chrono>
#include <thread>
#include <utility>
#include <vector>

namespace pemaro::test {
namespace {

constexpr std::chrono::milliseconds kPeriod(100);
constexpr int kPatience = 600;  // periods

// Tests may run beside each other; and a server that was told to end may still take in who comes next.
std::string nextSocket() {
    static int last = 0;
    return testing::TempDir() + "zelk-terminal-" + std::to_string(getpid()) + "-" +
           std::to_string(++last);
}

}  // namespace

Terminal::Terminal(const std::string& command, int columns, int rows) : mSocket(nextSocket()) {
    const RunResult start =
            tmux({"new-session", "-d", "-x", std::to_string(columns), "-y", std::to_string(rows),
                  command + "; echo ended with $?; sleep 1000"});
    EXPECT_EQ(0, start.status) << start.errors;
}

Terminal::~Terminal() {
    tmux({"kill-server"});
    unlink(mSocket.c_str());
}

RunResult Terminal::tmux(std::vector<std::string> words) const {
    words.insert(words.begin(), {"tmux", "-f", "/dev/null", "-S", mSocket, "-u"});
    return run(words);
}

std::string Terminal::text(bool withColors) {
    std::vector<std::string> words = {"capture-pane", "-p"};
    if (withColors) {
        words.emplace_back("-e");
    }
    return tmux(words).output;
}

bool Terminal::await(const std::function<bool(const std::string&)>& shows) {
    for (int i = 0; i < kPatience; ++i) {
        if (shows(text())) {
            return true;
        }
        std::this_thread::sleep_for(kPeriod);
    }
    return false;
}

bool Terminal::awaitText(const std::string& part) {
    return await([&part](const std::string& seen) { return seen.find(part) != std::string::npos; });
}

void Terminal::resize(int columns, int rows) {
    tmux({"resize-window", "-x", std::to_string(columns), "-y", std::to_string(rows)});
}

void Terminal::interrupt() {
    tmux({"send-keys", "C-c"});
}

}  // namespace pemaro::test
