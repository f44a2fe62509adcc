// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/commands/Commands.h"
#include "tools/zelkctl/services/Companion.h"

namespace pemaro::zelkctl {
namespace {

int ping() {
    return withClient([](TouchCompanionClient& client) {
        if (call("ping", [&] { return client.pingService(); }) != 1) {
            return fail("the service does not answer a ping", tools::kExitAbsent);
        }
        sayResult("the service is alive", JsonObject().addFlag("alive", true));
        return tools::kExitSuccess;
    });
}

}  // namespace

void addPingCommand(CLI::App& app, Action& action) {
    Command(app, action, "ping", "Ask whether the touch service is alive").runs(ping);
}

}  // namespace pemaro::zelkctl
