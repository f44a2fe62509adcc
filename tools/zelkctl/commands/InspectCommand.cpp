// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/commands/Commands.h"
#include "tools/zelkctl/services/Companion.h"

namespace pemaro::zelkctl {
namespace {

int inspect() {
    return withFacade([](ITouchCompanionFacade& facade) {
        unsigned int value = 0;
        const int status = call("inspect", [&] { return facade.inspect(&value); });
        if (status != STATUS_NO_ERROR) {
            return failStatus("inspect", status);
        }
        sayResult(fmt::format("{:#010x}", value), JsonObject().add("value", value));
        return tools::kExitSuccess;
    });
}

}  // namespace

void addInspectCommand(CLI::App& app, Action& action) {
    Command(app, action, "inspect", "Print the service's inspection word").runs(inspect);
}

}  // namespace pemaro::zelkctl
