// SPDX-License-Identifier: Apache-2.0
#include <memory>

#include "tools/zelkctl/commands/Commands.h"
#include "tools/zelkctl/services/Companion.h"

namespace pemaro::zelkctl {
namespace {

int setFilter(unsigned int mask) {
    return withFacade([&](ITouchCompanionFacade& facade) {
        const int status = call("setRecordFilter", [&] { return facade.setRecordFilter(mask); });
        const std::string words = fmt::format("record filter {:#x}", mask);
        if (status != STATUS_NO_ERROR) {
            return failStatus("setRecordFilter", status, words);
        }
        sayResult(words, JsonObject().add("filter", mask));
        return tools::kExitSuccess;
    });
}

}  // namespace

void addFilterCommand(CLI::App& app, Action& action) {
    auto mask = std::make_shared<unsigned int>(0);
    Command(app, action, "filter", "Choose what recorded frames contain")
            .number("MASK", *mask, "Bits that the service defines")
            .details(
                    "A service may tell the filter in force among its properties: "
                    "zelkctl property get.")
            .runs([mask] { return setFilter(*mask); });
}

}  // namespace pemaro::zelkctl
