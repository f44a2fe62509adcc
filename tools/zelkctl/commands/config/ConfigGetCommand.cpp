// SPDX-License-Identifier: Apache-2.0
#include <CLI/CLI.hpp>
#include <map>
#include <memory>
#include <string>
#include <vector>

#include "pemaro/TouchCompanionFactory.h"
#include "tools/zelkctl/commands/config/ConfigCommands.h"
#include "tools/zelkctl/services/Companion.h"
#include "tools/zelkctl/terminal/Json.h"

namespace pemaro::zelkctl {
namespace {

using Keys = std::vector<std::string>;
using Values = std::map<std::string, std::string>;
using Params = std::unique_ptr<ISerializableParams4>;

constexpr int kParamsClass = 4;
constexpr int kParamsVersion = kParamsClass << 16;
/// What stands for a value that is asked for; an empty one could not be read by the service.
constexpr const char* kWanted = "?";

/// The text form of a map puts a key between quotes, and cannot quote a quote.
int checkKeys(const Keys& keys) {
    for (const std::string& key : keys) {
        if (key.empty() || key.find_first_of("\"\\") != std::string::npos) {
            return failStatus("config get", STATUS_BAD_PARAMETER,
                              fmt::format("KEY: '{}' is no key", key));
        }
    }
    return tools::kExitSuccess;
}

std::string joined(const Keys& keys) {
    std::string list;
    for (const std::string& key : keys) {
        list += (list.empty() ? "" : ", ") + key;
    }
    return list;
}

Params wantedParams(const Keys& keys) {
    void* instance = nullptr;
    VEXPemaroCreateInstance(kParamsClass, kParamsVersion, &instance);
    Params params(static_cast<ISerializableParams4*>(instance));
    for (std::string key : keys) {
        std::string value = kWanted;
        params->setValue(key, value);
    }
    return params;
}

/// A parameter object hands out no maps and arrays; a client does, in their text form.
int readContainers(const Keys& keys, Values& values) {
    const android::sp<TouchCompanionClient> client = Connection::openClient();
    if (client == nullptr) {
        return tools::kExitFailure;
    }
    SerializableMap params;
    for (const std::string& key : keys) {
        params.add(key, std::string(kWanted));
    }
    const int status = client->getConfigParams(params);
    if (status != STATUS_NO_ERROR) {
        return failStatus("getConfigParams", status, joined(keys));
    }
    for (const std::string& key : keys) {
        SerializableValue found = params.valueFor(key);
        values[key] = found.serialize();
    }
    return tools::kExitSuccess;
}

int readValues(ITouchCompanionFacade& facade, const Keys& keys, Values& values) {
    const Params params = wantedParams(keys);
    const int status = facade.getConfigParams(params.get());
    if (status != STATUS_NO_ERROR) {
        return failStatus("getConfigParams", status, joined(keys));
    }
    Keys containers;
    for (int i = 0; i < params->size(); ++i) {
        std::string key;
        params->getKeyAt(i, key);
        if (params->getValueAt(i, values[key]) != STATUS_NO_ERROR) {
            containers.push_back(key);
        }
    }
    return containers.empty() ? tools::kExitSuccess : readContainers(containers, values);
}

void printValues(const Keys& keys, const Values& values, bool json) {
    JsonObject object;
    for (const std::string& key : keys) {
        if (json) {
            object.add(key, values.at(key));
        } else {
            fmt::print("{}={}\n", key, values.at(key));
        }
    }
    if (json) {
        fmt::print("{}\n", object.text());
    }
}

int getValues(const Keys& keys, bool json) {
    if (checkKeys(keys) != tools::kExitSuccess) {
        return tools::kExitFailure;
    }
    return withFacade([&](ITouchCompanionFacade& facade) {
        Values values;
        if (readValues(facade, keys, values) != tools::kExitSuccess) {
            return tools::kExitFailure;
        }
        for (const std::string& key : keys) {
            if (values.count(key) == 0) {
                return failStatus("config get", STATUS_NOT_FOUND,
                                  "the service told no value of " + key);
            }
        }
        printValues(keys, values, json);
        return tools::kExitSuccess;
    });
}

}  // namespace

void addConfigGetCommand(CLI::App& config, Action& action) {
    auto keys = std::make_shared<Keys>();
    auto json = std::make_shared<bool>(false);
    CLI::App* command = config.add_subcommand("get", "Print values of the configuration");
    command->add_option("KEY", *keys, "Keys that the service defines")->required();
    command->add_flag("--json", *json, "Print a JSON object, each value in it a text");
    command->callback([=, &action] { action = [=] { return getValues(*keys, *json); }; });
}

}  // namespace pemaro::zelkctl
