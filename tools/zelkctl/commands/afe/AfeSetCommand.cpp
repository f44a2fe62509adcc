// SPDX-License-Identifier: Apache-2.0
#include <memory>

#include "tools/zelkctl/commands/afe/AfeCommands.h"
#include "tools/zelkctl/services/Companion.h"
#include "tools/zelkctl/services/MapText.h"
#include "tools/zelkctl/terminal/Printable.h"

namespace pemaro::zelkctl {
namespace {

using Pairs = std::vector<std::string>;

int setParameters(SerializableMap parameters) {
    return withService([&](ITouchCompanionService& service) {
        const std::vector<std::string> names = keysOf(parameters);
        const int status = call("setAFEParams", [&] { return service.setAFEParams(parameters); });
        if (status != STATUS_NO_ERROR) {
            return failStatus("setAFEParams", status, joined(names));
        }
        return sayEntries("afe set", parameters, names);
    });
}

}  // namespace

void addAfeSetCommand(CLI::App& afe, Action& action) {
    auto pairs = std::make_shared<Pairs>();
    auto parameters = std::make_shared<SerializableMap>();
    Command(afe, action, "set", "Set parameters of the analog front end, all or none")
            .operands("PARAMETER=VALUE", *pairs, "The parameters with their values")
            .check([=] { return readPairs(*pairs, *parameters); })
            .runs([parameters] { return setParameters(*parameters); });
}

}  // namespace pemaro::zelkctl
