// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/commands/Commands.h"
#include "tools/zelkctl/services/Companion.h"

namespace pemaro::zelkctl {
namespace {

int ping() {
    return withClient([](TouchCompanionClient& client) {
        if (client.pingService() != 1) {
            return fail("the service does not answer a ping");
        }
        fmt::print("the service is alive\n");
        return tools::kExitSuccess;
    });
}

}  // namespace

void addPingCommand(CLI::App& app, Action& action) {
    addPlainCommand(app, action, "ping", "Ask whether the touch service is alive", ping);
}

}  // namespace pemaro::zelkctl
