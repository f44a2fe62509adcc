// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/commands/ManagerCommands.h"
#include "tools/zelkctl/commands/gesture/GestureCommands.h"

namespace pemaro::zelkctl {

void addGestureEnableCommand(CLI::App& gesture, Action& action) {
    addManagerNumberCommand<GestureManager>(gesture, action, "enable", "Look for a gesture again",
                                            "GESTURE", "gesture", "enableGesture",
                                            &GestureManagerClient::enableGesture);
}

}  // namespace pemaro::zelkctl
