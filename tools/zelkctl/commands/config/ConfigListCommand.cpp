// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/commands/config/ConfigCommands.h"
#include "tools/zelkctl/services/Companion.h"
#include "tools/zelkctl/services/MapText.h"
#include "tools/zelkctl/services/StackQuery.h"

namespace pemaro::zelkctl {
namespace {

int listValues() {
    return withClient([](TouchCompanionClient& client) {
        std::vector<std::string> keys;
        const int status = queryStack(client, "keys", keys);
        if (status != STATUS_NO_ERROR) {
            return failStatus("config list", status, noInterfaceFor("list of keys"));
        }
        SerializableMap values;
        const int result = readConfiguration(client, keys, values);
        return result == tools::kExitSuccess ? sayEntries("config list", values, keys) : result;
    });
}

}  // namespace

void addConfigListCommand(CLI::App& config, Action& action) {
    Command(config, action, "list", "Print the whole configuration")
            .details("The interface has no list of keys; the simulated stack tells its own.")
            .runs(listValues);
}

}  // namespace pemaro::zelkctl
