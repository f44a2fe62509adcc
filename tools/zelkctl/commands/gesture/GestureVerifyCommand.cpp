// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/commands/gesture/GestureCommands.h"
#include "tools/zelkctl/files/GestureFile.h"
#include "tools/zelkctl/services/Managers.h"

namespace pemaro::zelkctl {
namespace {

using Client = GestureManagerClient;
using Gesture = IGestureManagerClient::GestureData;

int verifyGesture(const std::string& file) {
    std::vector<Gesture> records;
    const std::string problem = readGestures(file, 1, records);
    if (!problem.empty()) {
        return fail(problem);
    }
    return withManager<GestureManager>([&](Client& client) {
        int number = 0;
        const int status = client.verifyGesture(records.data(), number);
        if (status != STATUS_NO_ERROR) {
            return failStatus("verifyGesture", status);
        }
        fmt::print("gesture {}\n", number);
        return tools::kExitSuccess;
    });
}

}  // namespace

void addGestureVerifyCommand(CLI::App& gesture, Action& action) {
    addTextCommand(gesture, action, "verify",
                   "Compare a drawn gesture with the defined ones, and tell its number", "FILE",
                   "File of one record of 72,144 bytes", verifyGesture);
}

}  // namespace pemaro::zelkctl
