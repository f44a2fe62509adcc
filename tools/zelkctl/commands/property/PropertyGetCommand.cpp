// SPDX-License-Identifier: Apache-2.0
#include <memory>

#include "tools/zelkctl/commands/property/PropertyCommands.h"
#include "tools/zelkctl/services/Companion.h"
#include "tools/zelkctl/services/MapText.h"

namespace pemaro::zelkctl {
namespace {

int getProperties(const std::vector<std::string>& wanted) {
    return withService([&](ITouchCompanionService& service) {
        SerializableMap properties;
        const int status = call("getProperties", [&] { return service.getProperties(properties); });
        if (status != STATUS_NO_ERROR) {
            return failStatus("getProperties", status);
        }
        return sayEntries("property get", properties, wanted);
    });
}

}  // namespace

void addPropertyGetCommand(CLI::App& property, Action& action) {
    auto names = std::make_shared<std::vector<std::string>>();
    Command(property, action, "get", "Print properties")
            .operands("PROPERTY", *names, "The properties; without one, all that there are", 0)
            .runs([names] { return getProperties(*names); });
}

}  // namespace pemaro::zelkctl
