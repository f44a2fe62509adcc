// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "tools/zelkctl/commands/Commands.h"

namespace pemaro::zelkctl {

// The commands behind "touch".

void addTouchFeaturesCommand(CLI::App& touch, Action& action);
void addTouchEnableCommand(CLI::App& touch, Action& action);
void addTouchDisableCommand(CLI::App& touch, Action& action);
void addTouchRegionCommand(CLI::App& touch, Action& action);
void addTouchWatchCommand(CLI::App& touch, Action& action);

}  // namespace pemaro::zelkctl
