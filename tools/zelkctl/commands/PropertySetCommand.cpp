// SPDX-License-Identifier: Apache-2.0
#include <CLI/CLI.hpp>
#include <memory>
#include <string>

#include "tools/zelkctl/commands/Commands.h"
#include "tools/zelkctl/services/Companion.h"
#include "tools/zelkctl/terminal/Number.h"

namespace pemaro::zelkctl {
namespace {

int setProperty(const std::string& name, const std::string& value) {
    if (!checkNumbers("property set", value)) {
        return tools::kExitFailure;
    }
    return operateClient(
            "setProperty",
            [&](TouchCompanionClient& client) {
                return client.setProperty(name.c_str(), value.c_str());
            },
            fmt::format("{} set to {}", name, value), name);
}

}  // namespace

void addPropertySetCommand(CLI::App& app, Action& action) {
    auto name = std::make_shared<std::string>();
    auto value = std::make_shared<std::string>();
    CLI::App& property = addGroup(app, "property", "Change a property");
    CLI::App* command = property.add_subcommand("set", "Set a property to a number");
    command->add_option("NAME", *name, "The property: setRollingLogSize")->required();
    command->add_option("VALUE", *value, "A number, or several in one argument")->required();
    command->callback([=, &action] { action = [=] { return setProperty(*name, *value); }; });
}

}  // namespace pemaro::zelkctl
