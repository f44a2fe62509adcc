// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/commands/config/ConfigCommands.h"

#include <CLI/CLI.hpp>
#include <memory>

#include "tools/zelkctl/services/Companion.h"

namespace pemaro::zelkctl {

void addConfigCommands(CLI::App& app, Action& action) {
    CLI::App& config = addGroup(app, "config", "Read and write the configuration");
    addConfigGetCommand(config, action);
    addConfigDumpCommand(config, action);
    addConfigLoadCommand(config, action);
    addConfigReloadCommand(config, action);
    addConfigSaveCommand(config, action);
}

void addFileCommand(CLI::App& config, Action& action, const char* name, const char* help,
                    int (*run)(const std::string& path)) {
    addTextCommand(config, action, name, help, "FILE", "File of the binary configuration", run);
}

void addServiceFileCommand(CLI::App& config, Action& action, const char* name, const char* help,
                           const char* operationName,
                           int (TouchCompanionClient::*operation)(const std::string*),
                           const char* done) {
    auto path = std::make_shared<std::string>();
    CLI::App* command = config.add_subcommand(name, help);
    const CLI::Option* given = command->add_option(
            "PATH", *path, "A file as the service sees it; without one, the service's own");
    command->callback([=, &action] {
        action = [=] {
            const std::string* file = given->count() == 0 ? nullptr : path.get();
            return operateClient(
                    operationName,
                    [&](TouchCompanionClient& client) { return (client.*operation)(file); },
                    fmt::format("configuration {}{}{}", done, file == nullptr ? "" : ": ", *path),
                    *path);
        };
    });
}

}  // namespace pemaro::zelkctl
