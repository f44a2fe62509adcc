// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/Commands.h"
#include "tools/zelkctl/Companion.h"

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
    app.add_subcommand("ping", "Ask whether the touch service is alive")->callback([&action] {
        action = ping;
    });
}

}  // namespace pemaro::zelkctl
