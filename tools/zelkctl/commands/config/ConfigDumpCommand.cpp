// SPDX-License-Identifier: Apache-2.0
#include <memory>

#include "tools/zelkctl/commands/config/ConfigCommands.h"
#include "tools/zelkctl/files/OutputFile.h"
#include "tools/zelkctl/services/Companion.h"

namespace pemaro::zelkctl {
namespace {

int readBinary(ITouchCompanionFacade& facade, std::string& bytes) {
    unsigned long length = 0;
    int status = call("getConfigParams", [&] { return facade.getConfigParams(nullptr, &length); });
    if (status == STATUS_NO_ERROR && length > kMaxConfigBytes) {
        return failStatus("config dump", STATUS_DATA_EXCEEDS_BUFFER,
                          fmt::format("the service tells {} bytes, and a transaction carries {}",
                                      length, kMaxConfigBytes));
    }
    if (status == STATUS_NO_ERROR) {
        bytes.resize(length);
        status =
                call("getConfigParams", [&] { return facade.getConfigParams(&bytes[0], &length); });
    }
    if (status != STATUS_NO_ERROR) {
        return failStatus("getConfigParams", status);
    }
    bytes.resize(length);
    return tools::kExitSuccess;
}

int dump(const std::string& path) {
    if (isStandardOutput(path)) {
        giveOutputToData();
    }
    return withFacade([&](ITouchCompanionFacade& facade) {
        std::string bytes;
        const int result = readBinary(facade, bytes);
        if (result != tools::kExitSuccess) {
            return result;
        }
        OutputFile file;
        if (!file.open(path) || !file.write(bytes) || !file.close()) {
            return fail("config dump", file.result());
        }
        sayResult(fmt::format("configuration of {} bytes written to {}", bytes.size(),
                              isStandardOutput(path) ? "the standard output" : path),
                  JsonObject().add("bytes", static_cast<int64_t>(bytes.size())).add("path", path));
        return tools::kExitSuccess;
    });
}

}  // namespace

void addConfigDumpCommand(CLI::App& config, Action& action) {
    auto path = std::make_shared<std::string>();
    Command(config, action, "dump", "Write the binary configuration to a file")
            .operand("FILE", *path, "The file; - is the standard output")
            .details(
                    "A file is replaced once all of it is there, where its folder allows that; a "
                    "device, a FIFO, or what a link leads to is written to.")
            .runs([path] { return dump(*path); });
}

}  // namespace pemaro::zelkctl
