// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "tools/zelkctl/commands/Command.h"

namespace pemaro::zelkctl {

/// Makes `app` zelkctl's command line, all of its options and commands. `action` is set when a
/// command is chosen.
void addCommandTree(CLI::App& app, Action& action);

}  // namespace pemaro::zelkctl
