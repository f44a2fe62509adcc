// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <functional>
#include <string>

namespace CLI {
class App;
}

namespace pemaro::zelkctl {

/// What a command does once the command line is known to be right; returns the exit status.
using Action = std::function<int()>;

// Each adds its command, or its group of commands, and their arguments to `app`, and sets `action`
// when one is chosen. The arguments live as long as `app`.

void addPingCommand(CLI::App& app, Action& action);
void addRecordCommand(CLI::App& app, Action& action);
void addRecordFileCommand(CLI::App& app, Action& action);
void addCommandCommand(CLI::App& app, Action& action);
void addFilterCommand(CLI::App& app, Action& action);
void addPropertySetCommand(CLI::App& app, Action& action);
void addEventCommand(CLI::App& app, Action& action);
void addInspectCommand(CLI::App& app, Action& action);
void addPacketSizeCommand(CLI::App& app, Action& action);
void addAuthCommand(CLI::App& app, Action& action);
void addConfigCommands(CLI::App& app, Action& action);
void addSessionCommands(CLI::App& app, Action& action);
void addTouchCommands(CLI::App& app, Action& action);
void addGestureCommands(CLI::App& app, Action& action);
void addHandCommands(CLI::App& app, Action& action);

// The kinds of commands of which there are several.

/// A word in front of other commands, which are added to what is returned.
CLI::App& addGroup(CLI::App& app, const char* name, const char* help);

/// A command without arguments.
void addPlainCommand(CLI::App& app, Action& action, const char* name, const char* help, Action run);

/// A command that prints what it was told, in JSON with --json.
void addQueryCommand(CLI::App& app, Action& action, const char* name, const char* help,
                     std::function<int(bool json)> query);

/// A command with one argument, which is a text.
void addTextCommand(CLI::App& app, Action& action, const char* name, const char* help,
                    const char* argument, const char* argumentHelp,
                    std::function<int(const std::string& text)> run);

/// A command with one argument, which is a number.
void addNumberCommand(CLI::App& app, Action& action, const char* name, const char* help,
                      const char* argument, const std::string& argumentHelp,
                      std::function<int(int number)> run);

}  // namespace pemaro::zelkctl
