// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "tools/zelkctl/commands/Commands.h"

namespace pemaro::zelkctl {

// The commands behind "property".

void addPropertyGetCommand(CLI::App& property, Action& action);
void addPropertySetCommand(CLI::App& property, Action& action);

}  // namespace pemaro::zelkctl
