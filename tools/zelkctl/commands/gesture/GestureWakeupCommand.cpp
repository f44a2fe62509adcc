// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/commands/ManagerCommands.h"
#include "tools/zelkctl/commands/gesture/GestureCommands.h"

namespace pemaro::zelkctl {

void addGestureWakeupCommand(CLI::App& gesture, Action& action) {
    using Client = GestureManagerClient;
    addSwitchCommand<GestureManager>(
            gesture, action, "wakeup", "Whether gestures wake the device",
            {"on", "enableWakeup", &Client::enableWakeup, "wake-up on"},
            {"off", "disableWakeup", &Client::disableWakeup, "wake-up off"});
}

}  // namespace pemaro::zelkctl
