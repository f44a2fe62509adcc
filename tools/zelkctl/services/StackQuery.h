// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>
#include <vector>

#include "pemaro/TouchCompanionClient.h"

namespace pemaro::zelkctl {

// What no interface offers, but the simulated stack tells or does on a request of its own. Another
// service refuses, which is told together with the reason.

/// The lines that a debug command is answered with; a status of Status.h.
int queryStack(TouchCompanionClient& client, const std::string& command,
               std::vector<std::string>& lines);

/// Sends "KEY=VALUE" settings as a request of this action.
int requestOfStack(TouchCompanionClient& client, const std::string& action,
                   const SerializableMap& parameters);

/// What is told about such a request that failed: "the interface has no list of sessions, and …".
std::string noInterfaceFor(const std::string& what);

/// The same query with a connection of its own, in silence; empty when it is not answered.
std::vector<std::string> tryQueryStack(const std::string& command);

}  // namespace pemaro::zelkctl
