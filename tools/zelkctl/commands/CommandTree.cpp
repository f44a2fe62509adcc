// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/commands/CommandTree.h"

#include <CLI/CLI.hpp>

#include "tools/zelkctl/commands/Commands.h"
#include "tools/zelkctl/terminal/Settings.h"

namespace pemaro::zelkctl {

void addCommandTree(CLI::App& app, Action& action) {
    app.name("zelkctl");
    app.description("Talks to the services of the touch-processing stack through libzelkclient.");
    app.require_subcommand(0, 1);
    app.add_flag("--log", settings().log, "Show the platform's log lines on stderr");
    addCommonOptions(app);
    addAllCommands(app, action);
}

}  // namespace pemaro::zelkctl
