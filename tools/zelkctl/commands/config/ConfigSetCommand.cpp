// SPDX-License-Identifier: Apache-2.0
#include <memory>

#include "tools/zelkctl/commands/config/ConfigCommands.h"
#include "tools/zelkctl/services/Companion.h"
#include "tools/zelkctl/services/MapText.h"
#include "tools/zelkctl/services/StackQuery.h"
#include "tools/zelkctl/terminal/Printable.h"

namespace pemaro::zelkctl {
namespace {

int setValues(SerializableMap values) {
    return withClient([&](TouchCompanionClient& client) {
        const std::vector<std::string> keys = keysOf(values);
        const int status = requestOfStack(client, "SET_CONFIG", values);
        if (status != STATUS_NO_ERROR) {
            return failStatus("config set", status,
                              status == STATUS_INVALID_COMMAND
                                      ? noInterfaceFor("operation for one value")
                                      : joined(keys));
        }
        return sayEntries("config set", values, keys);
    });
}

}  // namespace

void addConfigSetCommand(CLI::App& config, Action& action) {
    auto pairs = std::make_shared<std::vector<std::string>>();
    auto values = std::make_shared<SerializableMap>();
    Command(config, action, "set", "Set values of the configuration, all or none")
            .operands("KEY=VALUE", *pairs, "Keys with their values")
            .details(
                    "A value is a number, true, false, a map or an array in their text form; "
                    "anything else is a text. The interface has no operation for it; the "
                    "simulated stack has a request of its own.")
            .check([=] { return readPairs(*pairs, *values); })
            .runs([values] { return setValues(*values); });
}

}  // namespace pemaro::zelkctl
