// SPDX-License-Identifier: Apache-2.0
#include <string>
#include <vector>

#include "tools/zelkctl/commands/hand/HandCommands.h"
#include "tools/zelkctl/services/Managers.h"
#include "tools/zelkctl/terminal/Printable.h"

namespace pemaro::zelkctl {
namespace {

using Client = HandBiometricManagerClient;

std::string listOf(const std::vector<std::string>& names, unsigned int most) {
    std::string lines;
    for (const std::string& name : names) {
        lines += printable(name) + "\n";
    }
    return lines + fmt::format("{} of {} profiles", names.size(), most);
}

int showProfiles() {
    return withManager<HandManager>([](Client& client) {
        unsigned int most = 0;
        std::vector<std::string> names;
        int status = call("getMaxUser", [&] { return client.getMaxUser(most); });
        if (status != STATUS_NO_ERROR) {
            return failStatus("getMaxUser", status);
        }
        status = call("getProfileList", [&] { return client.getProfileList(names); });
        if (status != STATUS_NO_ERROR) {
            return failStatus("getProfileList", status);
        }
        sayResult(listOf(names, most), JsonObject().add("profiles", names).add("max", most));
        return tools::kExitSuccess;
    });
}

}  // namespace

void addHandProfilesCommand(CLI::App& hand, Action& action) {
    Command(hand, action, "profiles", "List the enrolled profiles, and how many there can be")
            .runs(showProfiles);
}

}  // namespace pemaro::zelkctl
