// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/commands/hand/HandCommands.h"

namespace pemaro::zelkctl {

void addHandDeleteCommand(CLI::App& hand, Action& action) {
    addHandProfileCommand(hand, action, "delete", "Forget a profile", "PROFILE", "deleteProfile",
                          &HandBiometricManagerClient::deleteProfile, "deleted");
}

}  // namespace pemaro::zelkctl
