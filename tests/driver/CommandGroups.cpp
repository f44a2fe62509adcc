// SPDX-License-Identifier: Apache-2.0
#include "tests/driver/CommandGroups.h"

#include <CLI/CLI.hpp>
#include <vector>

#include "tools/zelkctl/commands/CommandTree.h"

namespace pemaro::test {
namespace {

void addGroups(CommandGroups& groups, const CLI::App& app, const std::string& path) {
    const auto shown = [](const CLI::App* command) { return !command->get_group().empty(); };
    const std::vector<const CLI::App*> commands = app.get_subcommands(shown);
    groups[path] = !commands.empty();
    for (const CLI::App* command : commands) {
        addGroups(groups, *command,
                  path.empty() ? command->get_name() : path + " " + command->get_name());
    }
}

}  // namespace

CommandGroups readCommands() {
    CLI::App app;
    zelkctl::Action action;
    zelkctl::addCommandTree(app, action);
    CommandGroups groups;
    addGroups(groups, app, "");
    return groups;
}

}  // namespace pemaro::test
