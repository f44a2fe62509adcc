// SPDX-License-Identifier: Apache-2.0
#pragma once

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

/// Reads what the options cannot be asked for one by one, once they are parsed; throws a
/// CLI::ValidationError about what is wrong.
void readOptions(const CLI::App& app, CommandLine& line);

/// What --services takes.
std::vector<std::string> serviceWords();

}  // namespace pemaro::touchstack
