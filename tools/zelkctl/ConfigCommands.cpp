// SPDX-License-Identifier: Apache-2.0
#include <map>
#include <memory>
#include <string>
#include <vector>

#include "pemaro/TouchCompanionFactory.h"
#include "tools/zelkctl/Commands.h"
#include "tools/zelkctl/Companion.h"
#include "tools/zelkctl/ConfigFile.h"
#include "tools/zelkctl/Json.h"
#include "tools/zelkctl/Transaction.h"

namespace pemaro::zelkctl {
namespace {

using Keys = std::vector<std::string>;
using Values = std::map<std::string, std::string>;
using Params = std::unique_ptr<ISerializableParams4>;

constexpr int kParamsClass = 4;
constexpr int kParamsVersion = kParamsClass << 16;
/// What stands for a value that is asked for; an empty one could not be read by the service.
constexpr const char* kWanted = "?";
/// The rest of a transaction is for what accompanies the bytes.
constexpr size_t kMaxConfigBytes = kTransactionBytes - 1024;

int fail(const std::string& command, const FileResult& result) {
    return failStatus(command, result.status, result.detail);
}

// ---- values by key ----

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

// ---- the binary configuration ----

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

// ---- commands ----

void addGetCommand(CLI::App& config, Action& action) {
    auto keys = std::make_shared<Keys>();
    auto json = std::make_shared<bool>(false);
    CLI::App* command = config.add_subcommand("get", "Print values of the configuration");
    command->add_option("KEY", *keys, "Keys that the service defines")->required();
    command->add_flag("--json", *json, "Print a JSON object, each value in it a text");
    command->callback([=, &action] { action = [=] { return getValues(*keys, *json); }; });
}

/// A command about a file of ours.
void addFileCommand(CLI::App& config, Action& action, const char* name, const char* help,
                    int (*run)(const std::string& path)) {
    auto path = std::make_shared<std::string>();
    CLI::App* command = config.add_subcommand(name, help);
    command->add_option("FILE", *path, "File of the binary configuration")->required();
    command->callback([=, &action] { action = [=] { return run(*path); }; });
}

/// A command about a file of the service's.
void addServiceFileCommand(CLI::App& config, Action& action, const char* name, const char* help,
                           const char* operationName,
                           int (TouchCompanionClient::*operation)(const std::string*),
                           const char* done) {
    auto path = std::make_shared<std::string>();
    CLI::App* command = config.add_subcommand(name, help);
    const CLI::Option* given = command->add_option(
            "PATH", *path, "A file as the service sees it; without one, the service's own");
    command->callback([=, &action] {
        action = [=] {
            const std::string* file = given->count() == 0 ? nullptr : path.get();
            return operateClient(
                    operationName,
                    [&](TouchCompanionClient& client) { return (client.*operation)(file); },
                    fmt::format("configuration {}{}{}", done, file == nullptr ? "" : ": ", *path),
                    *path);
        };
    });
}

}  // namespace

void addConfigCommands(CLI::App& app, Action& action) {
    CLI::App* config = app.add_subcommand("config", "Read and write the configuration");
    config->require_subcommand(0, 1);
    addGetCommand(*config, action);
    addFileCommand(*config, action, "dump", "Write the binary configuration to a file", dump);
    addFileCommand(*config, action, "load", "Replace the binary configuration from a file", load);
    addServiceFileCommand(*config, action, "reload", "Make the service read its configuration",
                          "reloadConfig", &TouchCompanionClient::reloadConfig, "reloaded");
    addServiceFileCommand(*config, action, "save", "Make the service write its configuration",
                          "saveConfig", &TouchCompanionClient::saveConfig, "saved");
}

}  // namespace pemaro::zelkctl
