// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <functional>
#include <optional>
#include <string>

namespace CLI {
class App;
}

namespace pemaro::tools {

constexpr int kExitSuccess = 0;
constexpr int kExitFailure = 1;
constexpr int kExitUsage = 2;

/// Parses the command line, then runs `check`, which may throw a CLI::ValidationError of its own.
/// A value is the exit status of a program that has nothing more to do: it printed its help, or one
/// line on stderr about what is wrong with its arguments.
std::optional<int> parseCommandLine(CLI::App& app, int argc, char** argv,
                                    const std::function<void()>& check = nullptr);

/// Whether the platform's log lines, this library's among them, appear on stderr. The last words
/// of a process that is being aborted always do.
void showPlatformLog(bool show);

/// Ends the process without running the destructors of globals: Binder's threads are still at work
/// and would meet what is left of them.
[[noreturn]] void leave(int status);

}  // namespace pemaro::tools
