// SPDX-License-Identifier: Apache-2.0
#include <memory>

#include "tools/zelkctl/commands/config/ConfigCommands.h"
#include "tools/zelkctl/services/Companion.h"
#include "tools/zelkctl/services/MapText.h"
#include "tools/zelkctl/terminal/Printable.h"

namespace pemaro::zelkctl {
namespace {

using Keys = std::vector<std::string>;

/// What stands for a value that is asked for; an empty one could not be read by the service.
constexpr const char* kWanted = "?";

int askFor(TouchCompanionClient& client, const Keys& keys, SerializableMap& values) {
    values.clear();
    for (const std::string& key : keys) {
        values.add(key, std::string(kWanted));
    }
    return call("getConfigParams", [&] { return client.getConfigParams(values); });
}

/// The service tells one status for all keys; asked for one by one, it tells which are meant.
std::string refusedOnes(TouchCompanionClient& client, const Keys& keys, int status) {
    Keys refused;
    for (const std::string& key : keys) {
        SerializableMap value;
        if (keys.size() == 1 || askFor(client, {key}, value) == status) {
            refused.push_back(key);
        }
    }
    return joined(refused);
}

int getValues(const Keys& keys) {
    return withClient([&](TouchCompanionClient& client) {
        SerializableMap values;
        const int result = readConfiguration(client, keys, values);
        return result == tools::kExitSuccess ? sayEntries("config get", values, keys) : result;
    });
}

}  // namespace

int readConfiguration(TouchCompanionClient& client, const Keys& keys, SerializableMap& values) {
    const int status = askFor(client, keys, values);
    return status == STATUS_NO_ERROR
                   ? tools::kExitSuccess
                   : failStatus("getConfigParams", status, refusedOnes(client, keys, status));
}

void addConfigGetCommand(CLI::App& config, Action& action) {
    auto keys = std::make_shared<Keys>();
    Command(config, action, "get", "Print values of the configuration")
            .operands("KEY", *keys, "Keys that the service defines")
            .details(
                    "A value stands behind its key, as in gain=1.5, in the order of the keys; maps "
                    "and arrays in their text form.")
            .check([keys]() -> std::string {
                for (const std::string& key : *keys) {
                    const std::string problem = keyProblem(key);
                    if (!problem.empty()) {
                        return "KEY: " + problem;
                    }
                }
                return "";
            })
            .runs([keys] { return getValues(*keys); });
}

}  // namespace pemaro::zelkctl
