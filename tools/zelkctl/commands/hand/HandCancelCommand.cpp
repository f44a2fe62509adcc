// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/commands/hand/HandCommands.h"
#include "tools/zelkctl/services/Managers.h"

namespace pemaro::zelkctl {
namespace {

int cancel() {
    return operate<HandManager>(
            "cancelScan", [](HandBiometricManagerClient& client) { return client.cancelScan(); },
            "cancelled");
}

}  // namespace

void addHandCancelCommand(CLI::App& hand, Action& action) {
    addPlainCommand(hand, action, "cancel", "Give up what is going on", cancel);
}

}  // namespace pemaro::zelkctl
