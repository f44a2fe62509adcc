// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/commands/Commands.h"

#include "tools/zelkctl/commands/CheckCommand.h"
#include "tools/zelkctl/commands/frames/FramesCommands.h"

#ifdef ZELK_WITH_TRACE
#include "tools/zelkctl/commands/TraceCommand.h"
#endif

namespace pemaro::zelkctl {

void addAllCommands(CLI::App& app, Action& action) {
    addHelpCommand(app, action);
    addStatusCommand(app, action);
    addInfoCommand(app, action);
    addPingCommand(app, action);
    addCheckCommand(app, action);
#ifdef ZELK_WITH_TRACE
    addTraceCommand(app, action);
#endif
    addRecordCommand(app, action);
    addRecordFileCommand(app, action);
    addFramesCommands(app, action);
    addCommandCommand(app, action);
    addFilterCommand(app, action);
    addPropertyCommands(app, action);
    addAfeCommands(app, action);
    addEventCommand(app, action);
    addInspectCommand(app, action);
    addPacketSizeCommand(app, action);
    addAuthCommand(app, action);
    addConfigCommands(app, action);
    addSessionCommands(app, action);
    addTouchCommands(app, action);
    addGestureCommands(app, action);
    addHandCommands(app, action);
    addWordsCommand(app, action);
}

}  // namespace pemaro::zelkctl
