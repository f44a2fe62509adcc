// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/Commands.h"
#include "tools/zelkctl/Connection.h"
#include "tools/zelkctl/Report.h"

namespace pemaro::zelkctl {
namespace {

int ping() {
    const std::unique_ptr<Connection> connection = Connection::open();
    if (connection == nullptr) {
        return tools::kExitFailure;
    }
    const android::sp<TouchCompanionClient> client = Connection::openClient();
    if (client == nullptr) {
        return tools::kExitFailure;
    }
    if (client->pingService() != 1) {
        return fail("the service does not answer a ping");
    }
    fmt::print("the service is alive\n");
    return tools::kExitSuccess;
}

}  // namespace

void addPingCommand(CLI::App& app, Action& action) {
    app.add_subcommand("ping", "Ask whether the touch service is alive")->callback([&action] {
        action = ping;
    });
}

}  // namespace pemaro::zelkctl
