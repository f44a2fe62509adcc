// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/commands/frames/OpenRecording.h"

#include "tools/zelkctl/terminal/Printable.h"
#include "tools/zelkctl/terminal/ProgressLine.h"
#include "tools/zelkctl/terminal/Report.h"
#include "tools/zelkctl/terminal/Supervisor.h"

namespace pemaro::zelkctl {

std::unique_ptr<frames::RecordingFile> openRecording(const std::string& path, int& exitStatus) {
    const Waiting waiting("while reading " + path);
    ProgressLine progress("reading", "bytes");
    std::string problem;
    auto file = frames::RecordingFile::open(path, &problem, [&](uint64_t done, uint64_t total) {
        return progress.step(done, total);
    });
    if (file == nullptr) {
        exitStatus = mustStop() ? failStopped() : fail(printable(problem));
    }
    return file;
}

}  // namespace pemaro::zelkctl
