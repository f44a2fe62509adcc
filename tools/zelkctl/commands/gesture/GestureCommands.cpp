// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/commands/gesture/GestureCommands.h"

namespace pemaro::zelkctl {

void addGestureCommands(CLI::App& app, Action& action) {
    CLI::App& gesture = addGroup(app, "gesture", "Talk to the gesture manager");
    addGestureWakeupCommand(gesture, action);
    addGestureDetectCommand(gesture, action);
    addGestureAddCommand(gesture, action);
    addGestureDeleteCommand(gesture, action);
    addGestureEnableCommand(gesture, action);
    addGestureDisableCommand(gesture, action);
    addGestureVerifyCommand(gesture, action);
    addGestureListCommand(gesture, action);
    addGestureLimitsCommand(gesture, action);
    addGestureWatchCommand(gesture, action);
}

}  // namespace pemaro::zelkctl
