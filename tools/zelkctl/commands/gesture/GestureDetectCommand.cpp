// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/commands/ManagerCommands.h"
#include "tools/zelkctl/commands/gesture/GestureCommands.h"

namespace pemaro::zelkctl {

void addGestureDetectCommand(CLI::App& gesture, Action& action) {
    using Client = GestureManagerClient;
    addSwitchCommand<GestureManager>(
            gesture, action, "detect", "Whether gestures are looked for",
            {"start", "startGestureDetection", &Client::startGestureDetection, "detection started"},
            {"stop", "stopGestureDetection", &Client::stopGestureDetection, "detection stopped"});
}

}  // namespace pemaro::zelkctl
