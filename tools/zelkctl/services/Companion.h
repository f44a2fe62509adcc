// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "tools/zelkctl/services/Connection.h"
#include "tools/zelkctl/terminal/Output.h"
#include "tools/zelkctl/terminal/Report.h"
#include "tools/zelkctl/terminal/Supervisor.h"

namespace pemaro::zelkctl {

/// Runs `body` with a connected facade of the exported factory and returns the exit status, which
/// is that of `body` when the connection was made.
template <typename Body>
int withFacade(Body body) {
    int exitStatus = tools::kExitSuccess;
    const std::unique_ptr<Connection> connection = Connection::open(exitStatus);
    if (connection == nullptr) {
        return exitStatus;
    }
    const std::unique_ptr<ITouchCompanionFacade> facade = Connection::openFacade(exitStatus);
    return facade == nullptr ? exitStatus : body(*facade);
}

/// The same with a client, for what the facade does not offer.
template <typename Body>
int withClient(Body body) {
    int exitStatus = tools::kExitSuccess;
    const std::unique_ptr<Connection> connection = Connection::open(exitStatus);
    if (connection == nullptr) {
        return exitStatus;
    }
    const android::sp<TouchCompanionClient> client = Connection::openClient(exitStatus);
    return client == nullptr ? exitStatus : body(*client);
}

/// The same with the interface itself, for what the client does not offer; a client is registered
/// meanwhile, as the service may ask for.
template <typename Body>
int withService(Body body) {
    int exitStatus = tools::kExitSuccess;
    const std::unique_ptr<Connection> connection = Connection::open(exitStatus);
    if (connection == nullptr) {
        return exitStatus;
    }
    const android::sp<TouchCompanionClient> client = Connection::openClient(exitStatus);
    return client == nullptr ? exitStatus : body(*connection->service());
}

/// One operation of a client, and what is printed when it succeeded;
/// `about` is told with its failure.
template <typename Operation>
int operateClient(const char* name, Operation operation, const std::string& done,
                  JsonObject& object, const std::string& about = "") {
    return withClient([&](TouchCompanionClient& client) {
        const int status = call(name, [&] { return operation(client); });
        if (status != STATUS_NO_ERROR) {
            return failStatus(name, status, about);
        }
        sayResult(done, object);
        return tools::kExitSuccess;
    });
}

}  // namespace pemaro::zelkctl
