// SPDX-License-Identifier: Apache-2.0
#include <memory>
#include <string>
#include <vector>

#include "tools/zelkctl/commands/gesture/GestureCommands.h"
#include "tools/zelkctl/files/GestureFile.h"
#include "tools/zelkctl/services/Managers.h"
#include "tools/zelkctl/services/Transaction.h"
#include "tools/zelkctl/terminal/Printable.h"

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
        const Waiting waiting("while reading " + file);
        const std::string problem = readGestures(file, kMaxRecords, records);
        if (!problem.empty()) {
            return fail(problem);
        }
    }
    return withManager<GestureManager>([&](Client& client) {
        int number = 0;
        const int status = call("addGesture", [&] {
            return client.addGesture(static_cast<int>(records.size()), records.data(), number);
        });
        const size_t bytes = records.size() * sizeof(Gesture);
        if (status == STATUS_UNKNOWN_ERROR && bytes > kTransactionBytes) {
            return failStatus(
                    "addGesture", status,
                    fmt::format("{} records are {} bytes, and a transaction carries {} "
                                "records at most; nothing was added",
                                records.size(), bytes, kTransactionBytes / sizeof(Gesture)));
        }
        if (status != STATUS_NO_ERROR) {
            return failStatus("addGesture", status, joined(files));
        }
        sayResult(fmt::format("gesture {} added", number),
                  JsonObject().add("gesture", number).addFlag("added", true));
        return tools::kExitSuccess;
    });
}

}  // namespace

void addGestureAddCommand(CLI::App& gesture, Action& action) {
    auto files = std::make_shared<Files>();
    Command(gesture, action, "add", "Define a gesture by one or more samples, and tell its number")
            .operands("FILE", *files, "Files of samples, records of 72,144 bytes")
            .runs([files] { return addGesture(*files); });
}

}  // namespace pemaro::zelkctl
