// SPDX-License-Identifier: Apache-2.0
#include <memory>

#include "tools/zelkctl/commands/property/PropertyCommands.h"
#include "tools/zelkctl/services/Companion.h"

namespace pemaro::zelkctl {
namespace {

struct Property {
    std::string name;
    std::string value;
};

int setProperty(const Property& property) {
    return operateClient(
            "setProperty",
            [&](TouchCompanionClient& client) {
                return client.setProperty(property.name.c_str(), property.value.c_str());
            },
            fmt::format("{} set to {}", property.name, property.value),
            JsonObject().add("property", property.name).addParsed("value", property.value),
            property.name);
}

}  // namespace

void addPropertySetCommand(CLI::App& app, Action& action) {
    auto property = std::make_shared<Property>();
    Command(app, action, "set", "Set a property to a number")
            .operand("SETTING", property->name, "The property: setRollingLogSize")
            .operand("VALUE", property->value, "A number, or several in one argument")
            .check([property] {
                const std::string problem = tools::numberListProblem(property->value);
                return problem.empty() ? "" : "VALUE: " + problem;
            })
            .runs([property] { return setProperty(*property); });
}

}  // namespace pemaro::zelkctl
