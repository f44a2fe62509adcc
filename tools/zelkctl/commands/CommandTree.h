// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <optional>

#include "tools/zelkctl/commands/Command.h"

namespace pemaro::zelkctl {

/// Makes `app` zelkctl's command line, all of its options and commands. `action` is set when a
/// command is chosen.
void addCommandTree(CLI::App& app, Action& action);

/// Reads zelkctl's command line into `action`. A value is the exit status of a program that has nothing
/// more to do; see tools::parseCommandLine().
std::optional<int> chooseAction(int argc, char** argv, Action& action);

}  // namespace pemaro::zelkctl
