// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/commands/Commands.h"
#include "tools/zelkctl/services/Companion.h"
#include "tools/zelkctl/terminal/Json.h"

namespace pemaro::zelkctl {
namespace {

int showPacketSize(bool json) {
    return withFacade([json](ITouchCompanionFacade& facade) {
        const int size = facade.getPacketSize();
        // A failure cannot be told from the size that has its number.
        if (size >= STATUS_UNKNOWN_ERROR) {
            return failStatus("getPacketSize", size);
        }
        fmt::print("{}\n",
                   json ? JsonObject().add("packetSize", size).text() : std::to_string(size));
        return tools::kExitSuccess;
    });
}

}  // namespace

void addPacketSizeCommand(CLI::App& app, Action& action) {
    addQueryCommand(app, action, "packet-size", "Print the bytes of a frame", showPacketSize);
}

}  // namespace pemaro::zelkctl
