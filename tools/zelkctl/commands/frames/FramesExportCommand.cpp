// SPDX-License-Identifier: Apache-2.0
#include <sys/stat.h>

#include <CLI/CLI.hpp>
#include <algorithm>
#include <cerrno>
#include <cstring>
#include <functional>
#include <memory>
#include <string>

#include "frames/FrameContent.h"
#include "frames/RecordingFile.h"
#include "tools/zelkctl/commands/CommonOptions.h"
#include "tools/zelkctl/commands/frames/FramesCommands.h"
#include "tools/zelkctl/files/FramePicture.h"
#include "tools/zelkctl/files/FrameSummary.h"
#include "tools/zelkctl/files/FrameText.h"
#include "tools/zelkctl/files/OutputFile.h"
#include "tools/zelkctl/terminal/Printable.h"
#include "tools/zelkctl/terminal/Report.h"

namespace pemaro::zelkctl {
namespace {

using frames::FrameContent;
using frames::RecordingFile;

constexpr uint64_t kMaxNumber = 1000000000000;
constexpr unsigned kMaxScale = 64;

struct ExportOptions {
    std::string path;
    std::string format;
    std::string output;
    uint64_t first = 0;
    uint64_t last = kMaxNumber;
    uint64_t every = 1;
    unsigned scale = PictureStyle().scale;
};

/// Runs `body` with each frame that was asked for and its number, until it returns false; how many
/// frames the file has.
uint64_t forEachFrame(const RecordingFile& file, const ExportOptions& options,
                      const std::function<bool(uint64_t, const FrameContent&)>& body) {
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
    }
    return number;
}

/// The hottest cell of the whole recording, so that pictures can be compared.
int hottestCell(const RecordingFile& file) {
    int hottest = 1;
    forEachFrame(file, {}, [&hottest](uint64_t, const FrameContent& frame) {
        for (const int16_t cell : frame.image) {
            hottest = std::max<int>(hottest, cell);
        }
        return true;
    });
    return hottest;
}

int exportPictures(const RecordingFile& file, const ExportOptions& options) {
    if (mkdir(options.output.c_str(), 0777) != 0 && errno != EEXIST) {
        return fail(fmt::format("cannot make the folder {}: {}", printable(options.output),
                                strerror(errno)));
    }
    const PictureStyle style{options.scale, hottestCell(file)};
    uint64_t drawn = 0;
    uint64_t without = 0;
    std::string problem;
    forEachFrame(file, options, [&](uint64_t number, const FrameContent& frame) {
        const std::string png = drawFrame(frame, style);
        if (png.empty()) {
            without += 1;
            return true;
        }
        OutputFile output;
        if (!output.open(fmt::format("{}/frame-{:06}.png", options.output, number)) ||
            !output.write(png) || !output.close()) {
            problem = output.problem();
            return false;
        }
        drawn += 1;
        return true;
    });
    if (!problem.empty()) {
        return fail(printable(problem));
    }
    fmt::print(stderr, "{} pictures in {}{}\n", drawn, printable(options.output),
               without == 0 ? "" : fmt::format(", {} frames have no image", without));
    return tools::kExitSuccess;
}

int exportText(const RecordingFile& file, const ExportOptions& options) {
    OutputFile output;
    if (!output.open(options.output.empty() ? "-" : options.output)) {
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
    forEachFrame(file, options, [&](uint64_t number, const FrameContent& frame) {
        return output.write(text(number, frame));
    });
    return output.close() ? tools::kExitSuccess : fail(printable(output.problem()));
}

int exportFrames(const ExportOptions& options) {
    std::string problem;
    const auto file = RecordingFile::open(options.path, &problem);
    if (file == nullptr) {
        return fail(printable(problem));
    }
    const FrameSummary summary = summarize(*file);
    if (options.first >= summary.frames) {
        return fail(fmt::format("{} has {} frames: there is no frame {}", printable(options.path),
                                summary.frames, options.first));
    }
    const int result =
            options.format == "png" ? exportPictures(*file, options) : exportText(*file, options);
    if (result == tools::kExitSuccess && !file->problem().empty()) {
        return fail(printable(file->problem()));
    }
    const std::string damage = damageText(summary);
    return result != tools::kExitSuccess || damage.empty()
                   ? result
                   : fail(fmt::format("{}: {}; the intact frames are exported",
                                      printable(options.path), damage));
}

void check(const ExportOptions& options) {
    if (options.first > options.last) {
        throw CLI::ValidationError("--first", "is behind --last");
    }
    if (options.format == "png" && (options.output.empty() || options.output == "-")) {
        throw CLI::ValidationError("--output", "pictures need a folder");
    }
}

}  // namespace

void addFramesExportCommand(CLI::App& frames, Action& action) {
    auto options = std::make_shared<ExportOptions>();
    CLI::App* command =
            frames.add_subcommand("export", "Make pictures, tables or JSON of a recording");
    command->add_option("FILE", options->path, "The recording")->required();
    command->add_option("-f,--format", options->format,
                        "png (a heat map of each frame), csv (the fingers), cells (the images as "
                        "CSV) or json (all, a line for each frame)")
            ->required()
            ->check(CLI::IsMember({"png", "csv", "cells", "json"}));
    command->add_option("-o,--output", options->output,
                        "Folder for the pictures, or file for all else (standard output)")
            ->type_name("FILE");
    command->add_option("--first", options->first, "First frame, counted from 0")
            ->check(CLI::Range(uint64_t{0}, kMaxNumber));
    command->add_option("--last", options->last, "Last frame")
            ->check(CLI::Range(uint64_t{0}, kMaxNumber));
    command->add_option("--every", options->every, "Only every so many frames")
            ->check(CLI::Range(uint64_t{1}, kMaxNumber));
    command->add_option("--scale", options->scale, "Pixels of a cell of a picture")
            ->check(CLI::Range(1u, kMaxScale))
            ->capture_default_str();
    addCommonOptions(*command);
    command->callback([options, &action] {
        check(*options);
        action = [options] { return exportFrames(*options); };
    });
}

}  // namespace pemaro::zelkctl
