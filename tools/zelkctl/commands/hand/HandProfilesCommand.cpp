// SPDX-License-Identifier: Apache-2.0
#include <string>
#include <vector>

#include "tools/zelkctl/commands/hand/HandCommands.h"
#include "tools/zelkctl/services/Managers.h"
#include "tools/zelkctl/terminal/Json.h"
#include "tools/zelkctl/terminal/Printable.h"

namespace pemaro::zelkctl {
namespace {

using Client = HandBiometricManagerClient;

void printProfiles(const std::vector<std::string>& names, unsigned int most, bool json) {
    if (!json) {
        for (const std::string& name : names) {
            fmt::print("{}\n", printable(name));
        }
        fmt::print("{} of {} profiles\n", names.size(), most);
        return;
    }
    fmt::print("{}\n", JsonObject().add("profiles", names).add("max", most).text());
}

int showProfiles(bool json) {
    return withManager<HandManager>([json](Client& client) {
        unsigned int most = 0;
        std::vector<std::string> names;
        int status = client.getMaxUser(most);
        if (status != STATUS_NO_ERROR) {
            return failStatus("getMaxUser", status);
        }
        status = client.getProfileList(names);
        if (status != STATUS_NO_ERROR) {
            return failStatus("getProfileList", status);
        }
        printProfiles(names, most, json);
        return tools::kExitSuccess;
    });
}

}  // namespace

void addHandProfilesCommand(CLI::App& hand, Action& action) {
    addQueryCommand(hand, action, "profiles", "List the enrolled profiles", showProfiles);
}

}  // namespace pemaro::zelkctl
