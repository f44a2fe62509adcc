// SPDX-License-Identifier: Apache-2.0
#include <memory>
#include <string>

#include "tools/zelkctl/commands/hand/HandCommands.h"
#include "tools/zelkctl/services/Managers.h"
#include "tools/zelkctl/terminal/Printable.h"

namespace pemaro::zelkctl {

void addHandRenameCommand(CLI::App& hand, Action& action) {
    auto first = std::make_shared<std::string>();
    auto second = std::make_shared<std::string>();
    Command(hand, action, "rename", "Give a profile another name")
            .operand("PROFILE", *first, "The current name (the service may see it otherwise)")
            .operand("NAME", *second, "The new name")
            .runs([=] {
                return operate<HandManager>(
                        "renameProfile",
                        [&](HandBiometricManagerClient& client) {
                            return client.renameProfile(first->c_str(), second->c_str());
                        },
                        fmt::format("profile {} renamed {}", printable(*first), printable(*second)),
                        JsonObject().add("profile", *first).add("renamed", *second),
                        fmt::format("{} to {}", printable(*first), printable(*second)));
            });
}

}  // namespace pemaro::zelkctl
