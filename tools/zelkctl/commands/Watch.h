// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstdint>
#include <functional>
#include <string>

#include "tools/zelkctl/commands/Command.h"
#include "tools/zelkctl/services/EventReceiver.h"

namespace pemaro::zelkctl {

/// How to watch events, and for how long.
struct WatchOptions {
    uint64_t count = 0;  ///< events; 0: any number
    double seconds = 0;  ///< 0: until told to stop
    std::string output;
    EventFilter filter;  ///< others are neither shown, nor counted, nor kept
    bool draw = false;   ///< strokes
    EventGoal goal;      ///< the event that ends it

    bool isLimited() const { return count != 0 || seconds > 0 || goal.reached; }
};

void addWatchOptions(Command& command, WatchOptions& options);

// Which of the events are wanted, for managers that report such.

void addGestureOptions(Command& command, WatchOptions& options);
void addFeatureOption(Command& command, WatchOptions& options);
void addHandEventOption(Command& command, WatchOptions& options);

/// A command that watches, and has no options but these and those that `addMore` adds.
void addWatchCommand(CLI::App& app, Action& action, const char* name, const char* help,
                     const std::function<void(Command&, WatchOptions&)>& addMore,
                     std::function<int(const WatchOptions&)> run);

/// What is watched: a manager's name, and its client.
struct Watched {
    const char* service;
    std::function<int()> init;
    std::function<int()> deinit;
    /// Run once, when the client is connected for the first time; may be null.
    std::function<int()> begin;
    const char* beginName;
    /// Ends what begin() began, when the watch ends before it; may be null.
    std::function<int()> end;
    const char* endName;
    /// Why no events are to be expected, or the empty string; may be null.
    std::function<std::string()> silence;
};

/// Makes the client whose events go to the receiver.
using MakeWatched = std::function<Watched(EventReceiver*)>;

/// Prints events until there are enough or the command is asked to stop; returns the exit status.
/// When the service dies, the client is disconnected, waits for a new service, and connects again;
/// but where begin() began something, which is gone with its service, that is a failure. So is an event
/// that is waited for and has not come in time, or that tells of another end.
int watch(const WatchOptions& options, const MakeWatched& make);

}  // namespace pemaro::zelkctl
