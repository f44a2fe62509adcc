// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/commands/ManagerCommands.h"
#include "tools/zelkctl/commands/gesture/GestureCommands.h"

namespace pemaro::zelkctl {

void addGestureDisableCommand(CLI::App& gesture, Action& action) {
    addManagerNumberCommand<GestureManager>(
            gesture, action, "disable", "Keep a gesture, but do not look for it", "GESTURE",
            "gesture", "disableGesture", &GestureManagerClient::disableGesture);
}

}  // namespace pemaro::zelkctl
