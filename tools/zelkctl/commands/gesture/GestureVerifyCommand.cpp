// SPDX-License-Identifier: Apache-2.0
#include <memory>

#include "tools/zelkctl/commands/gesture/GestureCommands.h"
#include "tools/zelkctl/files/GestureFile.h"
#include "tools/zelkctl/services/Managers.h"

namespace pemaro::zelkctl {
namespace {

using Client = GestureManagerClient;
using Gesture = IGestureManagerClient::GestureData;

int verifyGesture(const std::string& file) {
    std::vector<Gesture> records;
    {
        const Waiting waiting("while reading " + file);
        const std::string problem = readGestures(file, 1, records);
        if (!problem.empty()) {
            return fail(problem);
        }
    }
    return withManager<GestureManager>([&](Client& client) {
        int number = 0;
        const int status =
                call("verifyGesture", [&] { return client.verifyGesture(records.data(), number); });
        if (status != STATUS_NO_ERROR) {
            return failStatus("verifyGesture", status, file);
        }
        sayResult(fmt::format("gesture {}", number), JsonObject().add("gesture", number));
        return tools::kExitSuccess;
    });
}

}  // namespace

void addGestureVerifyCommand(CLI::App& gesture, Action& action) {
    auto file = std::make_shared<std::string>();
    Command(gesture, action, "verify",
            "Compare a drawn gesture with the defined ones, and tell the number of the one that it "
            "is like")
            .operand("FILE", *file, "File of one record of 72,144 bytes")
            .runs([file] { return verifyGesture(*file); });
}

}  // namespace pemaro::zelkctl
