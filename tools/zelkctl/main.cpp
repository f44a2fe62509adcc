// SPDX-License-Identifier: Apache-2.0

/// zelkctl: the clients as a command line.

#include <signal.h>

#include <CLI/CLI.hpp>

#include "tools/common/CommandLine.h"
#include "tools/zelkctl/commands/CheckCommand.h"
#include "tools/zelkctl/commands/Commands.h"
#include "tools/zelkctl/commands/frames/FramesCommands.h"

int main(int argc, char** argv) {
    CLI::App app("Talks to the touch service through libzelkclient.", "zelkctl");
    app.require_subcommand(0, 1);
    bool showLog = false;
    app.add_flag("--log", showLog, "Show the platform's log lines on stderr");

    pemaro::zelkctl::Action action;
    pemaro::zelkctl::addPingCommand(app, action);
    pemaro::zelkctl::addCheckCommand(app, action);
    pemaro::zelkctl::addRecordCommand(app, action);
    pemaro::zelkctl::addRecordFileCommand(app, action);
    pemaro::zelkctl::addFramesCommands(app, action);
    pemaro::zelkctl::addCommandCommand(app, action);
    pemaro::zelkctl::addFilterCommand(app, action);
    pemaro::zelkctl::addPropertySetCommand(app, action);
    pemaro::zelkctl::addEventCommand(app, action);
    pemaro::zelkctl::addInspectCommand(app, action);
    pemaro::zelkctl::addPacketSizeCommand(app, action);
    pemaro::zelkctl::addAuthCommand(app, action);
    pemaro::zelkctl::addConfigCommands(app, action);
    pemaro::zelkctl::addSessionCommands(app, action);
    pemaro::zelkctl::addTouchCommands(app, action);
    pemaro::zelkctl::addGestureCommands(app, action);
    pemaro::zelkctl::addHandCommands(app, action);

    const auto done = pemaro::tools::parseCommandLine(app, argc, argv, [&action] {
        if (!action) {
            throw CLI::ValidationError("a command is required");
        }
    });
    if (done) {
        return *done;
    }
    pemaro::tools::showPlatformLog(showLog);
    // A reader of our output that went away is an error of writing, not the end of the recording.
    signal(SIGPIPE, SIG_IGN);
    pemaro::tools::leave(action());
}
