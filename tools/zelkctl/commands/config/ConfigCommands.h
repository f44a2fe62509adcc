// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstddef>
#include <string>
#include <vector>

#include "pemaro/TouchCompanionClient.h"
#include "tools/zelkctl/commands/Commands.h"
#include "tools/zelkctl/files/ConfigFile.h"
#include "tools/zelkctl/services/Transaction.h"
#include "tools/zelkctl/terminal/Report.h"

namespace pemaro::zelkctl {

// The commands behind "config".

void addConfigListCommand(CLI::App& config, Action& action);
void addConfigGetCommand(CLI::App& config, Action& action);
void addConfigSetCommand(CLI::App& config, Action& action);
void addConfigDumpCommand(CLI::App& config, Action& action);
void addConfigLoadCommand(CLI::App& config, Action& action);
void addConfigReloadCommand(CLI::App& config, Action& action);
void addConfigSaveCommand(CLI::App& config, Action& action);

/// The most that a binary configuration may have;
/// the rest of a transaction is for what accompanies the bytes.
constexpr size_t kMaxConfigBytes = kTransactionBytes - 1024;

inline int fail(const std::string& command, const FileResult& result) {
    return failStatus(command, result.status, result.detail);
}

/// Reads the values of some keys, and tells which are not there; the exit status.
int readConfiguration(TouchCompanionClient& client, const std::vector<std::string>& keys,
                      SerializableMap& values);

/// A command about a file of the service's.
void addServiceFileCommand(CLI::App& config, Action& action, const char* name, const char* help,
                           const char* operationName,
                           int (TouchCompanionClient::*operation)(const std::string*),
                           const char* done);

}  // namespace pemaro::zelkctl
