// SPDX-License-Identifier: Apache-2.0
#include <CLI/CLI.hpp>
#include <memory>
#include <string>

#include "tools/zelkctl/commands/hand/HandCommands.h"
#include "tools/zelkctl/services/Managers.h"
#include "tools/zelkctl/terminal/Printable.h"

namespace pemaro::zelkctl {

void addHandRenameCommand(CLI::App& hand, Action& action) {
    auto first = std::make_shared<std::string>();
    auto second = std::make_shared<std::string>();
    CLI::App* command = hand.add_subcommand("rename", "Give a profile another name");
    command->add_option("FIRST", *first, "The current name (the service may see it otherwise)")
            ->required();
    command->add_option("SECOND", *second, "The new name")->required();
    command->callback([=, &action] {
        action = [=] {
            return operate<HandManager>(
                    "renameProfile",
                    [&](HandBiometricManagerClient& client) {
                        return client.renameProfile(first->c_str(), second->c_str());
                    },
                    fmt::format("profile {} renamed {}", printable(*first), printable(*second)));
        };
    });
}

}  // namespace pemaro::zelkctl
