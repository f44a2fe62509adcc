// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/commands/Commands.h"

#include <algorithm>
#include <iterator>

#include "tools/zelkctl/commands/CheckCommand.h"
#include "tools/zelkctl/commands/frames/FramesCommands.h"

#ifdef ZELK_WITH_TRACE
#include "tools/zelkctl/commands/TraceCommand.h"
#endif

namespace pemaro::zelkctl {

namespace {

struct Row {
    std::string_view name;
    void (*add)(CLI::App& app, Action& action);
};

constexpr Row kRows[] = {
        {"help", addHelpCommand},        {"status", addStatusCommand},
        {"info", addInfoCommand},        {"ping", addPingCommand},
        {"check", addCheckCommand},
#ifdef ZELK_WITH_TRACE
        {"trace", addTraceCommand},
#endif
        {"record", addRecordCommand},    {"record-file", addRecordFileCommand},
        {"frames", addFramesCommands},   {"command", addCommandCommand},
        {"filter", addFilterCommand},    {"property", addPropertyCommands},
        {"afe", addAfeCommands},         {"event", addEventCommand},
        {"inspect", addInspectCommand},  {"packet-size", addPacketSizeCommand},
        {"auth", addAuthCommand},        {"config", addConfigCommands},
        {"session", addSessionCommands}, {"touch", addTouchCommands},
        {"gesture", addGestureCommands}, {"hand", addHandCommands},
        {"words", addWordsCommand},
};

}  // namespace

void addCommands(CLI::App& app, Action& action, std::string_view name) {
    const auto* const end = std::end(kRows);
    const auto* const named =
            std::find_if(kRows, end, [name](const Row& row) { return row.name == name; });
    if (named != end) {
        named->add(app, action);
        return;
    }
    for (const Row& row : kRows) {
        row.add(app, action);
    }
}

}  // namespace pemaro::zelkctl
