// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/commands/Commands.h"
#include "tools/zelkctl/services/Companion.h"

namespace pemaro::zelkctl {
namespace {

int showPacketSize() {
    return withFacade([](ITouchCompanionFacade& facade) {
        const int size = call("getPacketSize", [&] { return facade.getPacketSize(); });
        // A failure cannot be told from the size that has its number.
        if (size >= STATUS_UNKNOWN_ERROR) {
            return failStatus("getPacketSize", size);
        }
        sayResult(std::to_string(size), JsonObject().add("packetSize", size));
        return tools::kExitSuccess;
    });
}

}  // namespace

void addPacketSizeCommand(CLI::App& app, Action& action) {
    Command(app, action, "packet-size", "Print the bytes of a frame").runs(showPacketSize);
}

}  // namespace pemaro::zelkctl
