// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "tools/zelkctl/commands/Commands.h"

namespace pemaro::zelkctl {

// The commands behind "afe".

void addAfeGetCommand(CLI::App& afe, Action& action);
void addAfeSetCommand(CLI::App& afe, Action& action);

}  // namespace pemaro::zelkctl
