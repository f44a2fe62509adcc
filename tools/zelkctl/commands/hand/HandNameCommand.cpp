// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/commands/hand/HandCommands.h"

namespace pemaro::zelkctl {

void addHandNameCommand(CLI::App& hand, Action& action) {
    addHandProfileCommand(hand, action, "name", "Name the profile that was enrolled last", "NAME",
                          "setProfileName", &HandBiometricManagerClient::setProfileName, "named");
}

}  // namespace pemaro::zelkctl
