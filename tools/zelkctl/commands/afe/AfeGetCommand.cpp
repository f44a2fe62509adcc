// SPDX-License-Identifier: Apache-2.0
#include <memory>

#include "pemaro/SerializableMapArray.h"
#include "tools/zelkctl/commands/afe/AfeCommands.h"
#include "tools/zelkctl/services/Companion.h"
#include "tools/zelkctl/services/MapText.h"

namespace pemaro::zelkctl {
namespace {

struct Options {
    std::vector<std::string> names;
    bool channels = false;
};

int getChannels(ITouchCompanionService& service) {
    SerializableMapArray channels;
    const int status = call("getAFEParams", [&] { return service.getAFEParams(channels); });
    if (status != STATUS_NO_ERROR) {
        return failStatus("getAFEParams", status);
    }
    const std::string text = channels.serialize();
    sayResult(text, JsonObject().addParsed("channels", text));
    return tools::kExitSuccess;
}

int getParameters(const Options& options) {
    return withService([&](ITouchCompanionService& service) {
        if (options.channels) {
            return getChannels(service);
        }
        SerializableMap parameters;
        const int status = call("getAFEParams", [&] { return service.getAFEParams(parameters); });
        if (status != STATUS_NO_ERROR) {
            return failStatus("getAFEParams", status);
        }
        return sayEntries("afe get", parameters, options.names);
    });
}

}  // namespace

void addAfeGetCommand(CLI::App& afe, Action& action) {
    auto options = std::make_shared<Options>();
    Command(afe, action, "get", "Print parameters of the analog front end")
            .operands("PARAMETER", options->names,
                      "The parameters; without one, all that there are", 0)
            .flag("--channels", options->channels, "All of them for each channel, as an array")
            .check([options] {
                return options->channels && !options->names.empty()
                               ? "--channels excludes PARAMETER"
                               : "";
            })
            .runs([options] { return getParameters(*options); });
}

}  // namespace pemaro::zelkctl
