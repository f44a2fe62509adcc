// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/commands/CommandTree.h"

#include <CLI/CLI.hpp>

#include "tools/common/CommandLine.h"
#include "tools/zelkctl/commands/Commands.h"
#include "tools/zelkctl/terminal/Report.h"
#include "tools/zelkctl/terminal/Settings.h"

namespace pemaro::zelkctl {

void addCommandTree(CLI::App& app, Action& action, std::string_view name) {
    app.name("zelkctl");
    app.description("Talks to the services of the touch-processing stack through libzelkclient.");
    app.require_subcommand(0, 1);
    app.add_flag("--log", settings().log, "Show the platform's log lines on stderr");
    addCommonOptions(app);
    addCommands(app, action, name);
}

std::optional<int> chooseAction(int argc, char** argv, Action& action) {
    // Lives on: to take it apart again would take a program's start a while.
    static CLI::App app;
    // To make all commands takes a quarter of a start, and only "help" tells of others than the
    // first word names.
    const std::string_view first = argc > 1 ? argv[1] : "";
    addCommandTree(app, action, first == "help" ? "" : first);
    return tools::parseCommandLine(
            app, argc, argv,
            [&] {
                if (action) {
                    return;
                }
                if (!app.get_subcommands().empty()) {
                    throw CLI::ValidationError(app.get_subcommands()[0]->get_name() +
                                               ": a command is required");
                }
                throw CLI::CallForHelp();
            },
            [](const std::string& problem) { failUsage(problem); });
}

}  // namespace pemaro::zelkctl
