// SPDX-License-Identifier: Apache-2.0
#include <CLI/CLI.hpp>
#include <memory>
#include <string>
#include <vector>

#include "tools/zelkctl/commands/gesture/GestureCommands.h"
#include "tools/zelkctl/files/GestureFile.h"
#include "tools/zelkctl/services/Managers.h"
#include "tools/zelkctl/services/Transaction.h"

namespace pemaro::zelkctl {
namespace {

using Client = GestureManagerClient;
using Gesture = IGestureManagerClient::GestureData;
using Files = std::vector<std::string>;

/// Many more than a transaction can carry, and few enough to be read.
constexpr size_t kMaxRecords = 256;

int addGesture(const Files& files) {
    std::vector<Gesture> records;
    for (const std::string& file : files) {
        const std::string problem = readGestures(file, kMaxRecords, records);
        if (!problem.empty()) {
            return fail(problem);
        }
    }
    return withManager<GestureManager>([&](Client& client) {
        int number = 0;
        const int status =
                client.addGesture(static_cast<int>(records.size()), records.data(), number);
        const size_t bytes = records.size() * sizeof(Gesture);
        if (status == STATUS_UNKNOWN_ERROR && bytes > kTransactionBytes) {
            return fail(fmt::format(
                    "addGesture: {} ({} records are {} bytes, and a transaction "
                    "carries {} records at most; nothing was added)",
                    errStr(status), records.size(), bytes, kTransactionBytes / sizeof(Gesture)));
        }
        if (status != STATUS_NO_ERROR) {
            return failStatus("addGesture", status);
        }
        fmt::print("gesture {} added\n", number);
        return tools::kExitSuccess;
    });
}

}  // namespace

void addGestureAddCommand(CLI::App& gesture, Action& action) {
    auto files = std::make_shared<Files>();
    CLI::App* command =
            gesture.add_subcommand("add",
                                   "Define a gesture by one or more samples, and tell its "
                                   "number");
    command->add_option("FILE", *files, "Files of samples, records of 72,144 bytes")->required();
    command->callback([files, &action] { action = [files] { return addGesture(*files); }; });
}

}  // namespace pemaro::zelkctl
