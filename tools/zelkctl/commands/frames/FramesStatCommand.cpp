// SPDX-License-Identifier: Apache-2.0
#include <memory>
#include <string>

#include "tools/common/StandardOutput.h"
#include "tools/zelkctl/commands/frames/FramesCommands.h"
#include "tools/zelkctl/commands/frames/OpenRecording.h"
#include "tools/zelkctl/files/FrameSummary.h"
#include "tools/zelkctl/terminal/Output.h"
#include "tools/zelkctl/terminal/Printable.h"
#include "tools/zelkctl/terminal/Report.h"
#include "tools/zelkctl/terminal/Settings.h"

namespace pemaro::zelkctl {
namespace {

struct StatOptions {
    std::string path;
};

int showStat(const StatOptions& options) {
    int exitStatus = tools::kExitSuccess;
    const auto file = openRecording(options.path, exitStatus);
    if (file == nullptr) {
        return exitStatus;
    }
    const FrameSummary summary = summarize(*file);
    if (settings().json) {
        say(summaryJson(*file, summary));
    } else {
        tools::writeOutput(summaryText(*file, summary));
    }
    const std::string damage = damageText(summary);
    return damage.empty() ? tools::kExitSuccess
                          : fail(fmt::format("{}: {}", printable(options.path), damage));
}

}  // namespace

void addFramesStatCommand(CLI::App& frames, Action& action) {
    auto options = std::make_shared<StatOptions>();
    Command(frames, action, "stat", "Tell what a recording holds")
            .operand("FILE", options->path, "The recording")
            .details(
                    "Told are how many frames there are, how long and how regular they are, and "
                    "what is lost, corrupt or cut off, and where. The exit status is 1 when the "
                    "recording is damaged.")
            .runs([options] { return showStat(*options); });
}

}  // namespace pemaro::zelkctl
