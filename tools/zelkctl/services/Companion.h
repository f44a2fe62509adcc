// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "tools/zelkctl/services/Connection.h"
#include "tools/zelkctl/terminal/Report.h"

namespace pemaro::zelkctl {

/// Runs `body` with a connected facade of the exported factory and returns the exit status, which
/// is that of `body` when the connection was made.
template <typename Body>
int withFacade(Body body) {
    const std::unique_ptr<Connection> connection = Connection::open();
    if (connection == nullptr) {
        return tools::kExitFailure;
    }
    const std::unique_ptr<ITouchCompanionFacade> facade = Connection::openFacade();
    return facade == nullptr ? tools::kExitFailure : body(*facade);
}

/// The same with a client, for what the facade does not offer.
template <typename Body>
int withClient(Body body) {
    const std::unique_ptr<Connection> connection = Connection::open();
    if (connection == nullptr) {
        return tools::kExitFailure;
    }
    const android::sp<TouchCompanionClient> client = Connection::openClient();
    return client == nullptr ? tools::kExitFailure : body(*client);
}

/// One operation of a client, and what is printed when it succeeded;
/// `detail` is told with its failure.
template <typename Operation>
int operateClient(const char* name, Operation operation, const std::string& done,
                  const std::string& detail = "") {
    return withClient([&](TouchCompanionClient& client) {
        const int status = operation(client);
        if (status != STATUS_NO_ERROR) {
            return failStatus(name, status, detail);
        }
        fmt::print("{}\n", done);
        return tools::kExitSuccess;
    });
}

}  // namespace pemaro::zelkctl
