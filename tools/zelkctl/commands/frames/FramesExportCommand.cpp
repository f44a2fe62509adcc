// SPDX-License-Identifier: Apache-2.0
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <cstring>
#include <functional>
#include <memory>
#include <string>

#include "frames/FrameContent.h"
#include "frames/RecordingFile.h"
#include "tools/zelkctl/commands/frames/FramesCommands.h"
#include "tools/zelkctl/commands/frames/OpenRecording.h"
#include "tools/zelkctl/files/FramePicture.h"
#include "tools/zelkctl/files/FrameSummary.h"
#include "tools/zelkctl/files/FrameText.h"
#include "tools/zelkctl/files/OutputFile.h"
#include "tools/zelkctl/terminal/Output.h"
#include "tools/zelkctl/terminal/Printable.h"
#include "tools/zelkctl/terminal/ProgressLine.h"
#include "tools/zelkctl/terminal/Report.h"
#include "tools/zelkctl/terminal/Supervisor.h"

namespace pemaro::zelkctl {
namespace {

using frames::FrameContent;
using frames::RecordingFile;

constexpr int64_t kMaxNumber = 1000000000000;
constexpr unsigned kMaxScale = 64;

struct ExportOptions {
    std::string path;
    std::string format;
    std::string output = kStandardOutput;
    uint64_t first = 0;
    uint64_t last = kMaxNumber;
    uint64_t every = 1;
    unsigned scale = PictureStyle().scale;
};

/// Runs `body` with each frame that was asked for and its number, until it returns false or the
/// command is asked to stop.
void forEachFrame(const RecordingFile& file, const ExportOptions& options,
                  const std::function<bool(uint64_t, const FrameContent&)>& body) {
    const bool showsData = isStandardOutput(options.output) && isatty(STDOUT_FILENO) != 0;
    ProgressLine progress("exporting", "frames", !showsData);
    uint64_t number = 0;
    for (const RecordingFile::Part& part : file.parts()) {
        if (part.kind != RecordingFile::Kind::kFrame) {
            continue;
        }
        const bool isChosen = number >= options.first && number <= options.last &&
                              (number - options.first) % options.every == 0;
        if (isChosen) {
            const uint8_t* frame = file.bytes(part);
            if (frame == nullptr || !body(number, frames::readFrameContent(frame))) {
                break;
            }
        }
        number += 1;
        if (!progress.step(number, file.parts().size())) {
            break;
        }
    }
}

int exportPictures(const RecordingFile& file, const ExportOptions& options) {
    if (mkdir(options.output.c_str(), 0777) != 0 && errno != EEXIST) {
        return fail(fmt::format("cannot make the folder {}: {}", printable(options.output),
                                strerror(errno)));
    }
    const PictureStyle style{options.scale, hottestCell(file)};
    int64_t drawn = 0;
    int64_t without = 0;
    std::string problem;
    forEachFrame(file, options, [&](uint64_t number, const FrameContent& frame) {
        const std::string png = drawFrame(frame, style);
        if (png.empty()) {
            without += 1;
            return true;
        }
        OutputFile output;
        if (!output.open(fmt::format("{}/frame-{:06}.png", options.output, number),
                         file.descriptor()) ||
            !output.write(png) || !output.close()) {
            problem = output.problem();
            return false;
        }
        drawn += 1;
        return true;
    });
    if (problem.empty()) {
        problem = file.problem();
    }
    if (!problem.empty()) {
        return fail(printable(problem));
    }
    sayResult(fmt::format("{} pictures in {}{}", drawn, printable(options.output),
                          without == 0 ? "" : fmt::format(", {} frames have no image", without)),
              JsonObject()
                      .add("pictures", drawn)
                      .add("without_image", without)
                      .add("folder", options.output));
    return mustStop() ? failStopped() : tools::kExitSuccess;
}

int exportText(const RecordingFile& file, const ExportOptions& options) {
    OutputFile output;
    if (!output.open(options.output, file.descriptor())) {
        return fail(printable(output.problem()));
    }
    const auto text = options.format == "csv"     ? fingersCsv
                      : options.format == "cells" ? cellsCsv
                                                  : frameJson;
    if (options.format == "csv") {
        output.write(fingersCsvHead());
    } else if (options.format == "cells") {
        // A file may hold images of several widths: the head has names for the widest.
        output.write(cellsCsvHead(summarize(file).columns.most));
    }
    int64_t written = 0;
    forEachFrame(file, options, [&](uint64_t number, const FrameContent& frame) {
        written += 1;
        return output.write(text(number, frame));
    });
    if (mustStop() && output.result().isGood()) {
        return failStopped();
    }
    if (!file.problem().empty()) {
        return fail(printable(file.problem()));
    }
    if (!output.close()) {
        return fail(printable(output.problem()));
    }
    // What was asked for on the standard output stands there alone.
    if (!isStandardOutput(options.output)) {
        sayResult(fmt::format("{} frames in {}", written, printable(options.output)),
                  JsonObject().add("frames", written).add("file", options.output));
    }
    return tools::kExitSuccess;
}

int exportFrames(const ExportOptions& options) {
    int exitStatus = tools::kExitSuccess;
    const auto file = openRecording(options.path, exitStatus);
    if (file == nullptr) {
        return exitStatus;
    }
    const FrameSummary summary = summarize(*file);
    if (options.first >= summary.frames) {
        return fail(fmt::format("{} has {} frames: there is no frame {}", printable(options.path),
                                summary.frames, options.first));
    }
    const int result =
            options.format == "png" ? exportPictures(*file, options) : exportText(*file, options);
    const std::string damage = damageText(summary);
    return result != tools::kExitSuccess || damage.empty()
                   ? result
                   : fail(fmt::format("{}: {}; the intact frames are exported",
                                      printable(options.path), damage));
}

std::string problemOf(const ExportOptions& options) {
    return options.format == "png" && options.output == kStandardOutput
                   ? "--output: pictures need a folder"
                   : tools::orderProblem(static_cast<int64_t>(options.first),
                                         static_cast<int64_t>(options.last));
}

}  // namespace

void addFramesExportCommand(CLI::App& frames, Action& action) {
    auto options = std::make_shared<ExportOptions>();
    Command(frames, action, "export", "Make pictures, tables or JSON of a recording")
            .operand("FILE", options->path, "The recording")
            .choiceOption("-f,--format", options->format, {"png", "csv", "cells", "json"},
                          "png (a heat map of each frame), csv (the fingers), cells (the images as "
                          "CSV) or json (all, a line for each frame)")
            .required("--format")
            .option("-o,--output", "FILE", options->output,
                    "Folder for the pictures, or file for all else (the standard output)")
            .number("--first", options->first, "First frame, counted from 0", {0, kMaxNumber})
            .number("--last", options->last, "Last frame", {0, kMaxNumber})
            .number("--every", options->every, "Only every so many frames", {1, kMaxNumber})
            .number("--scale", options->scale,
                    fmt::format("Pixels of a cell of a picture ({})", options->scale),
                    {1, kMaxScale})
            .details(
                    "A picture is a heat map with a cross at each finger, in which the hottest "
                    "cell of the whole recording is the brightest. What is intact of a damaged "
                    "recording is exported, and the exit status is 1 then.")
            .check([options] { return problemOf(*options); })
            .runs([options] { return exportFrames(*options); });
}

}  // namespace pemaro::zelkctl
