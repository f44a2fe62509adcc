// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/commands/config/ConfigCommands.h"

#include <memory>
#include <optional>

#include "tools/zelkctl/services/Companion.h"

namespace pemaro::zelkctl {

void addConfigCommands(CLI::App& app, Action& action) {
    CLI::App& config = addGroup(app, "config", "Read and write the configuration");
    addConfigListCommand(config, action);
    addConfigGetCommand(config, action);
    addConfigSetCommand(config, action);
    addConfigDumpCommand(config, action);
    addConfigLoadCommand(config, action);
    addConfigReloadCommand(config, action);
    addConfigSaveCommand(config, action);
}

void addServiceFileCommand(CLI::App& config, Action& action, const char* name, const char* help,
                           const char* operationName,
                           int (TouchCompanionClient::*operation)(const std::string*),
                           const char* done) {
    auto path = std::make_shared<std::optional<std::string>>();
    Command(config, action, name, help)
            .operand("PATH", *path, "A file as the service sees it; without one, the service's own")
            .runs([=] {
                const std::string* file = *path ? &**path : nullptr;
                const std::string about = path->value_or("");
                JsonObject object;
                object.add("configuration", std::string(done));
                if (file != nullptr) {
                    object.add("path", about);
                }
                return operateClient(
                        operationName,
                        [&](TouchCompanionClient& client) { return (client.*operation)(file); },
                        fmt::format("configuration {}{}{}", done, file == nullptr ? "" : ": ",
                                    about),
                        object, about);
            });
}

}  // namespace pemaro::zelkctl
