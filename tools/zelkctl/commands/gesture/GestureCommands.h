// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "tools/zelkctl/commands/Commands.h"

namespace pemaro::zelkctl {

// The commands behind "gesture".

void addGestureWakeupCommand(CLI::App& gesture, Action& action);
void addGestureDetectCommand(CLI::App& gesture, Action& action);
void addGestureAddCommand(CLI::App& gesture, Action& action);
void addGestureDeleteCommand(CLI::App& gesture, Action& action);
void addGestureEnableCommand(CLI::App& gesture, Action& action);
void addGestureDisableCommand(CLI::App& gesture, Action& action);
void addGestureVerifyCommand(CLI::App& gesture, Action& action);
void addGestureListCommand(CLI::App& gesture, Action& action);
void addGestureLimitsCommand(CLI::App& gesture, Action& action);
void addGestureWatchCommand(CLI::App& gesture, Action& action);

}  // namespace pemaro::zelkctl
