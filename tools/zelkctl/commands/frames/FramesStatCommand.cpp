// SPDX-License-Identifier: Apache-2.0
#include <CLI/CLI.hpp>
#include <memory>
#include <string>

#include "frames/RecordingFile.h"
#include "tools/zelkctl/commands/frames/FramesCommands.h"
#include "tools/zelkctl/files/FrameSummary.h"
#include "tools/zelkctl/terminal/Printable.h"
#include "tools/zelkctl/terminal/Report.h"

namespace pemaro::zelkctl {
namespace {

struct StatOptions {
    std::string path;
    bool json = false;
};

int showStat(const StatOptions& options) {
    std::string problem;
    const auto file = frames::RecordingFile::open(options.path, &problem);
    if (file == nullptr) {
        return fail(printable(problem));
    }
    const FrameSummary summary = summarize(*file);
    if (options.json) {
        fmt::print("{}\n", summaryJson(*file, summary));
    } else {
        fmt::print("{}", summaryText(*file, summary));
    }
    const std::string damage = damageText(summary);
    return damage.empty() ? tools::kExitSuccess
                          : fail(fmt::format("{}: {}", printable(options.path), damage));
}

}  // namespace

void addFramesStatCommand(CLI::App& frames, Action& action) {
    auto options = std::make_shared<StatOptions>();
    CLI::App* command = frames.add_subcommand("stat", "Tell what a recording holds");
    command->add_option("FILE", options->path, "The recording")->required();
    command->add_flag("--json", options->json, "Print a JSON object");
    command->callback([options, &action] { action = [options] { return showStat(*options); }; });
}

}  // namespace pemaro::zelkctl
