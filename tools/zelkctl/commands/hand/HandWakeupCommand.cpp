// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/commands/ManagerCommands.h"
#include "tools/zelkctl/commands/hand/HandCommands.h"

namespace pemaro::zelkctl {

void addHandWakeupCommand(CLI::App& hand, Action& action) {
    using Client = HandBiometricManagerClient;
    addSwitchCommand<HandManager>(hand, action, "wakeup", "Whether a hand wakes the device",
                                  {"on", "enableWakeup", &Client::enableWakeup, "wake-up on"},
                                  {"off", "disableWakeup", &Client::disableWakeup, "wake-up off"});
}

}  // namespace pemaro::zelkctl
