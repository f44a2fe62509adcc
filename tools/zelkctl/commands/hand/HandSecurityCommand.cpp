// SPDX-License-Identifier: Apache-2.0
#include <memory>

#include "tools/zelkctl/commands/ManagerCommands.h"
#include "tools/zelkctl/commands/hand/HandCommands.h"
#include "tools/zelkctl/services/Managers.h"

namespace pemaro::zelkctl {
namespace {

int setSecurity(int level) {
    const std::string words = fmt::format("security level {}", level);
    return operate<HandManager>(
            "setSecurity",
            [=](HandBiometricManagerClient& client) { return client.setSecurity(level); }, words,
            JsonObject().add("security", level), words);
}

}  // namespace

void addHandSecurityCommand(CLI::App& hand, Action& action) {
    auto level = std::make_shared<int>(0);
    Command(hand, action, "security", "Set the security level")
            .number("LEVEL", *level, "A number that the service defines")
            .details(kStateIsInInfo)
            .runs([level] { return setSecurity(*level); });
}

}  // namespace pemaro::zelkctl
