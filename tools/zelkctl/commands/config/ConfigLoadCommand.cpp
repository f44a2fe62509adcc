// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/commands/config/ConfigCommands.h"
#include "tools/zelkctl/services/Companion.h"

namespace pemaro::zelkctl {
namespace {

int load(const std::string& path) {
    std::string bytes;
    const FileResult read = readConfigFile(path, kMaxConfigBytes, bytes);
    if (!read.isGood()) {
        return fail("config load", read);
    }
    return withFacade([&](ITouchCompanionFacade& facade) {
        const int status = facade.setConfigParams(bytes.data(), bytes.size());
        if (status != STATUS_NO_ERROR) {
            return failStatus("setConfigParams", status, path);
        }
        fmt::print("configuration of {} bytes loaded from {}\n", bytes.size(), path);
        return tools::kExitSuccess;
    });
}

}  // namespace

void addConfigLoadCommand(CLI::App& config, Action& action) {
    addFileCommand(config, action, "load", "Replace the binary configuration from a file", load);
}

}  // namespace pemaro::zelkctl
