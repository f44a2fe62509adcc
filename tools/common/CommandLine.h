// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <functional>
#include <optional>
#include <string>

#include "tools/common/ExitStatus.h"

namespace CLI {
class App;
}

namespace pemaro::tools {

/// Tells what is wrong with a command line.
using UsageReport = std::function<void(const std::string& problem)>;

/// Parses the command line, then runs `check`, which may throw a CLI::ValidationError of its own.
/// A value is the exit status of a program that has nothing more to do: it printed its help, or told
/// what is wrong with its arguments: the first thing in the order in which they were typed. A word
/// that is mistyped is told with the nearest one; an argument that is empty is refused.
std::optional<int> parseCommandLine(CLI::App& app, int argc, char** argv,
                                    const std::function<void()>& check = nullptr,
                                    const UsageReport& report = nullptr);

/// Whether the platform's log lines, this library's among them, appear on stderr. The last words
/// of a process that is being aborted always do.
void showPlatformLog(bool show);

/// Ends the process without running the destructors of globals: Binder's threads are still at work
/// and would meet what is left of them.
[[noreturn]] void leave(int status);

}  // namespace pemaro::tools
