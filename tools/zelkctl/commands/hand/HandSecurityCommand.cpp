// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/commands/hand/HandCommands.h"
#include "tools/zelkctl/services/Managers.h"

namespace pemaro::zelkctl {
namespace {

int setSecurity(int level) {
    return operate<HandManager>(
            "setSecurity",
            [=](HandBiometricManagerClient& client) { return client.setSecurity(level); },
            fmt::format("security level {}", level));
}

}  // namespace

void addHandSecurityCommand(CLI::App& hand, Action& action) {
    addNumberCommand(hand, action, "security", "Set the security level", "LEVEL",
                     "A number that the service defines", setSecurity);
}

}  // namespace pemaro::zelkctl
