// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/commands/Commands.h"
#include "tools/zelkctl/services/Companion.h"
#include "tools/zelkctl/terminal/Number.h"

namespace pemaro::zelkctl {
namespace {

int setFilter(const std::string& text) {
    const auto mask = readNumber("filter", "MASK", text, kUnsigned32);
    if (!mask) {
        return tools::kExitFailure;
    }
    return withFacade([&](ITouchCompanionFacade& facade) {
        const int status = facade.setRecordFilter(static_cast<unsigned int>(*mask));
        if (status != STATUS_NO_ERROR) {
            return failStatus("setRecordFilter", status);
        }
        fmt::print("record filter {:#x}\n", *mask);
        return tools::kExitSuccess;
    });
}

}  // namespace

void addFilterCommand(CLI::App& app, Action& action) {
    addTextCommand(app, action, "filter", "Choose what recorded frames contain", "MASK",
                   "Bits that the service defines", setFilter);
}

}  // namespace pemaro::zelkctl
