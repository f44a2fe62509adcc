// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/commands/Commands.h"
#include "tools/zelkctl/services/Companion.h"
#include "tools/zelkctl/terminal/Json.h"

namespace pemaro::zelkctl {
namespace {

int inspect(bool json) {
    return withFacade([json](ITouchCompanionFacade& facade) {
        unsigned int value = 0;
        const int status = facade.inspect(&value);
        if (status != STATUS_NO_ERROR) {
            return failStatus("inspect", status);
        }
        fmt::print("{}\n",
                   json ? JsonObject().add("value", value).text() : fmt::format("{:#010x}", value));
        return tools::kExitSuccess;
    });
}

}  // namespace

void addInspectCommand(CLI::App& app, Action& action) {
    addQueryCommand(app, action, "inspect", "Print the service's inspection word", inspect);
}

}  // namespace pemaro::zelkctl
