// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/commands/frames/FramesCommands.h"

namespace pemaro::zelkctl {

void addFramesCommands(CLI::App& app, Action& action) {
    CLI::App& frames = addGroup(app, "frames",
                                "Look into touch frames, as they come or as they were recorded");
    addFramesWatchCommand(frames, action);
    addFramesStatCommand(frames, action);
    addFramesExportCommand(frames, action);
    addFramesReportCommand(frames, action);
}

}  // namespace pemaro::zelkctl
