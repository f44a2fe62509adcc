// SPDX-License-Identifier: Apache-2.0
#include <memory>

#include "tools/zelkctl/commands/config/ConfigCommands.h"
#include "tools/zelkctl/services/Companion.h"

namespace pemaro::zelkctl {
namespace {

FileResult readFile(const std::string& path, std::string& bytes) {
    const Waiting waiting("while reading " + path);
    return readConfigFile(path, kMaxConfigBytes, bytes);
}

int load(const std::string& path) {
    std::string bytes;
    const FileResult read = readFile(path, bytes);
    if (!read.isGood()) {
        return fail("config load", read);
    }
    return withFacade([&](ITouchCompanionFacade& facade) {
        const int status = call("setConfigParams",
                                [&] { return facade.setConfigParams(bytes.data(), bytes.size()); });
        if (status != STATUS_NO_ERROR) {
            return failStatus("setConfigParams", status, path);
        }
        sayResult(fmt::format("configuration of {} bytes loaded from {}", bytes.size(), path),
                  JsonObject().add("bytes", static_cast<int64_t>(bytes.size())).add("path", path));
        return tools::kExitSuccess;
    });
}

}  // namespace

void addConfigLoadCommand(CLI::App& config, Action& action) {
    auto path = std::make_shared<std::string>();
    Command(config, action, "load", "Replace the binary configuration from a file")
            .operand("FILE", *path, "File of the binary configuration")
            .details(fmt::format("A file of more than {} bytes is refused: one transaction carries "
                                 "no more.",
                                 kMaxConfigBytes))
            .runs([path] { return load(*path); });
}

}  // namespace pemaro::zelkctl
