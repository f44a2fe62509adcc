// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/commands/hand/HandCommands.h"
#include "tools/zelkctl/services/Managers.h"

namespace pemaro::zelkctl {
namespace {

int cancel() {
    return operate<HandManager>(
            "cancelScan", [](HandBiometricManagerClient& client) { return client.cancelScan(); },
            "cancelled", JsonObject().addFlag("cancelled", true));
}

}  // namespace

void addHandCancelCommand(CLI::App& hand, Action& action) {
    Command(hand, action, "cancel", "Give up what is going on").runs(cancel);
}

}  // namespace pemaro::zelkctl
