// SPDX-License-Identifier: Apache-2.0
#include <memory>
#include <string>

#include "tools/zelkctl/commands/frames/FramesCommands.h"
#include "tools/zelkctl/commands/frames/OpenRecording.h"
#include "tools/zelkctl/files/FrameReport.h"
#include "tools/zelkctl/files/OutputFile.h"
#include "tools/zelkctl/terminal/Output.h"
#include "tools/zelkctl/terminal/Printable.h"
#include "tools/zelkctl/terminal/Report.h"
#include "tools/zelkctl/terminal/Supervisor.h"

namespace pemaro::zelkctl {
namespace {

struct ReportOptions {
    std::string path;
    std::string output;
    uint64_t every = 1;
};

int makeReport(const ReportOptions& options) {
    int exitStatus = tools::kExitSuccess;
    const auto file = openRecording(options.path, exitStatus);
    if (file == nullptr) {
        return exitStatus;
    }
    if (isStandardOutput(options.output)) {
        giveOutputToData();
    }
    OutputFile output;
    if (!output.open(options.output, file->descriptor())) {
        return fail(printable(output.problem()));
    }
    const FrameSummary summary = summarize(*file);
    std::string problem;
    const std::string page = reportPage(*file, summary, options.every, &problem);
    if (mustStop()) {
        return failStopped();
    }
    if (page.empty()) {
        return fail(fmt::format("{}: {}", printable(options.path), problem));
    }
    if (!output.write(page) || !output.close()) {
        return fail(printable(output.problem()));
    }
    const auto shown = static_cast<int64_t>((summary.frames + options.every - 1) / options.every);
    sayResult(fmt::format("{} frames in {}", shown, printable(options.output)),
              JsonObject()
                      .add("frames", shown)
                      .add("bytes", static_cast<int64_t>(page.size()))
                      .add("file", options.output));
    const std::string damage = damageText(summary);
    return damage.empty() ? tools::kExitSuccess
                          : fail(fmt::format("{}: {}; the page has the intact frames",
                                             printable(options.path), damage));
}

}  // namespace

void addFramesReportCommand(CLI::App& frames, Action& action) {
    auto options = std::make_shared<ReportOptions>();
    Command(frames, action, "report", "Make a page for a browser that plays a recording")
            .operand("FILE", options->path, "The recording")
            .option("-o,--output", "FILE", options->output,
                    "File to write the page to; - is the standard output")
            .required("--output")
            .number("--every", options->every, "Only every so many frames", {1, 1000000})
            .details(
                    "The page has the heat map, the tracks of the fingers, and the times between "
                    "frames. It needs no network and nothing beside it. Of a very long recording "
                    "--every takes what fits.")
            .runs([options] { return makeReport(*options); });
}

}  // namespace pemaro::zelkctl
