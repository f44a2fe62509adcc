// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <optional>
#include <string_view>

#include "tools/zelkctl/commands/Command.h"

namespace pemaro::zelkctl {

/// Makes `app` zelkctl's command line, all of its options and commands; or of the commands only the one
/// of this name, if there is such a command. `action` is set when a command is chosen.
void addCommandTree(CLI::App& app, Action& action, std::string_view name = "");

/// Reads zelkctl's command line into `action`. A value is the exit status of a program that has nothing
/// more to do; see tools::parseCommandLine().
std::optional<int> chooseAction(int argc, char** argv, Action& action);

}  // namespace pemaro::zelkctl
