// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/services/StackQuery.h"

#include <sstream>

#include "pemaro/Status.h"
#include "tools/zelkctl/services/Connection.h"
#include "tools/zelkctl/terminal/Supervisor.h"

namespace pemaro::zelkctl {
namespace {

constexpr const char* kDebug = "DEBUG_COMMAND";

int send(TouchCompanionClient& client, const std::string& action, const SerializableMap& parameters,
         SerializableMap& results) {
    SerializableMap body;
    body.add("ACTION", action);
    body.add("PARAMETERS", parameters);
    SerializableMap wrapped;
    wrapped.add("REQUEST", body);
    SerializableMap request;
    request.add(kDebug, wrapped);
    SerializableMap response;
    const int status = call("sendCommand", [&] { return client.sendCommand(request, response); });
    if (status != STATUS_NO_ERROR) {
        return status;
    }
    SerializableMap outer;
    SerializableMap inner;
    if (response.valueFor(kDebug).getValue(outer) != STATUS_NO_ERROR ||
        outer.valueFor("RESPONSE").getValue(inner) != STATUS_NO_ERROR) {
        return STATUS_INVALID_FORMAT;
    }
    inner.valueFor("RESULTS").getValue(results);
    return STATUS_NO_ERROR;
}

}  // namespace

int queryStack(TouchCompanionClient& client, const std::string& command,
               std::vector<std::string>& lines) {
    SerializableMap parameters;
    parameters.add("NUM_OF_ELEMENTS", 0);
    parameters.add("SEND_COMMAND_NAME", command);
    SerializableMap results;
    const int status = send(client, "SEND_COMMAND", parameters, results);
    if (status != STATUS_NO_ERROR) {
        return status;
    }
    std::string text;
    if (results.valueFor("OUT_STRING").getValue(text) != STATUS_NO_ERROR) {
        return STATUS_INVALID_FORMAT;
    }
    std::istringstream stream(text);
    for (std::string line; std::getline(stream, line);) {
        lines.push_back(line);
    }
    return STATUS_NO_ERROR;
}

int requestOfStack(TouchCompanionClient& client, const std::string& action,
                   const SerializableMap& parameters) {
    SerializableMap results;
    return send(client, action, parameters, results);
}

std::string noInterfaceFor(const std::string& what) {
    return "the interface has no " + what +
           ", and the service does not know the simulated stack's own request for it";
}

std::vector<std::string> tryQueryStack(const std::string& command) {
    std::vector<std::string> lines;
    if (ServiceWatch::find(Connection::kService) == nullptr) {
        return lines;
    }
    const android::sp<TouchCompanionClient> client = new TouchCompanionClient();
    if (call("init", [&] { return client->init(); }) == STATUS_NO_ERROR) {
        queryStack(*client, command, lines);
    }
    return lines;
}

}  // namespace pemaro::zelkctl
