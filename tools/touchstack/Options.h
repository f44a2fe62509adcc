// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <optional>
#include <string>
#include <vector>

#include "simulator/TouchStack.h"
#include "simulator/faults/Fault.h"

namespace CLI {
class App;
}

namespace pemaro::touchstack {

/// What the command line tells.
struct CommandLine {
    simulator::TouchStack::Options options;
    std::string replayPath;
    std::string source;
    bool hasFrameBytes = false;
    std::vector<simulator::Fault> faults;
    bool showLog = false;
    // As they were typed: they are looked at when all options are there.
    std::vector<std::string> serviceTexts;
    std::vector<std::string> faultTexts;
};

/// Makes `app` the program's command line, which stores into `line`.
void addOptions(CLI::App& app, CommandLine& line);

/// Reads the program's command line into `line`. A value is the exit status of a program that has nothing
/// more to do; see tools::parseCommandLine().
std::optional<int> readCommandLine(int argc, char** argv, CommandLine& line);

/// What --services takes.
std::vector<std::string> serviceWords();

}  // namespace pemaro::touchstack
