// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/commands/config/ConfigCommands.h"
#include "tools/zelkctl/services/Companion.h"

namespace pemaro::zelkctl {
namespace {

int readConfiguration(ITouchCompanionFacade& facade, std::string& bytes) {
    unsigned long length = 0;
    int status = facade.getConfigParams(nullptr, &length);
    if (status == STATUS_NO_ERROR && length > kMaxConfigBytes) {
        return failStatus("config dump", STATUS_DATA_EXCEEDS_BUFFER,
                          fmt::format("the service tells {} bytes, and a transaction carries {}",
                                      length, kMaxConfigBytes));
    }
    if (status == STATUS_NO_ERROR) {
        bytes.resize(length);
        status = facade.getConfigParams(&bytes[0], &length);
    }
    if (status != STATUS_NO_ERROR) {
        return failStatus("getConfigParams", status);
    }
    bytes.resize(length);
    return tools::kExitSuccess;
}

int dump(const std::string& path) {
    return withFacade([&](ITouchCompanionFacade& facade) {
        std::string bytes;
        if (readConfiguration(facade, bytes) != tools::kExitSuccess) {
            return tools::kExitFailure;
        }
        const FileResult written = writeConfigFile(path, bytes);
        if (!written.isGood()) {
            return fail("config dump", written);
        }
        fmt::print("configuration of {} bytes written to {}\n", bytes.size(), path);
        return tools::kExitSuccess;
    });
}

}  // namespace

void addConfigDumpCommand(CLI::App& config, Action& action) {
    addFileCommand(config, action, "dump", "Write the binary configuration to a file", dump);
}

}  // namespace pemaro::zelkctl
