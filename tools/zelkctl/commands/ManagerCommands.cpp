// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/commands/ManagerCommands.h"

#include <CLI/CLI.hpp>
#include <memory>

namespace pemaro::zelkctl {

void addEitherCommand(CLI::App& manager, Action& action, const char* name, const char* help,
                      const char* first, const char* second, std::function<int(bool isFirst)> run) {
    auto word = std::make_shared<std::string>();
    CLI::App* command = manager.add_subcommand(name, help);
    command->add_option(std::string(first) + "|" + second, *word)
            ->required()
            ->check(CLI::IsMember({first, second}));
    command->callback([=, &action] { action = [=] { return run(*word == first); }; });
}

}  // namespace pemaro::zelkctl
