// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/commands/hand/HandCommands.h"

namespace pemaro::zelkctl {

void addHandMatchCommand(CLI::App& hand, Action& action) {
    using Client = HandBiometricManagerClient;
    addHandActivityCommand(hand, action,
                           {"match", "Match hands against the profiles", "matching",
                            "startMatching", &Client::startMatching, "stopMatching",
                            &Client::stopMatching, "stopMatching", &Client::stopMatching});
}

}  // namespace pemaro::zelkctl
