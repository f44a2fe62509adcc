// SPDX-License-Identifier: Apache-2.0
#include <CLI/CLI.hpp>
#include <memory>
#include <string>

#include "frames/RecordingFile.h"
#include "tools/zelkctl/commands/CommonOptions.h"
#include "tools/zelkctl/commands/frames/FramesCommands.h"
#include "tools/zelkctl/files/FrameReport.h"
#include "tools/zelkctl/files/OutputFile.h"
#include "tools/zelkctl/terminal/Printable.h"
#include "tools/zelkctl/terminal/Report.h"

namespace pemaro::zelkctl {
namespace {

struct ReportOptions {
    std::string path;
    std::string output;
    uint64_t every = 1;
};

int makeReport(const ReportOptions& options) {
    std::string problem;
    const auto file = frames::RecordingFile::open(options.path, &problem);
    if (file == nullptr) {
        return fail(printable(problem));
    }
    const FrameSummary summary = summarize(*file);
    const std::string page = reportPage(*file, summary, options.every, &problem);
    if (page.empty()) {
        return fail(fmt::format("{}: {}", printable(options.path), problem));
    }
    OutputFile output;
    if (!output.open(options.output) || !output.write(page) || !output.close()) {
        return fail(printable(output.problem()));
    }
    const std::string damage = damageText(summary);
    return damage.empty() ? tools::kExitSuccess
                          : fail(fmt::format("{}: {}; the page has the intact frames",
                                             printable(options.path), damage));
}

}  // namespace

void addFramesReportCommand(CLI::App& frames, Action& action) {
    auto options = std::make_shared<ReportOptions>();
    CLI::App* command =
            frames.add_subcommand("report", "Make a page for a browser that plays a recording");
    command->add_option("FILE", options->path, "The recording")->required();
    command->add_option("-o,--output", options->output, "File to write the page to")
            ->type_name("FILE")
            ->required();
    command->add_option("--every", options->every, "Only every so many frames")
            ->check(CLI::Range(uint64_t{1}, uint64_t{1000000}));
    addCommonOptions(*command);
    command->callback([options, &action] { action = [options] { return makeReport(*options); }; });
}

}  // namespace pemaro::zelkctl
