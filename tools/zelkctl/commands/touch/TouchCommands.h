// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>
#include <vector>

#include "pemaro/TouchManagerClient.h"
#include "tools/zelkctl/commands/Commands.h"

namespace pemaro::zelkctl {

// The commands behind "touch".

void addTouchFeaturesCommand(CLI::App& touch, Action& action);
void addTouchEnableCommand(CLI::App& touch, Action& action);
void addTouchDisableCommand(CLI::App& touch, Action& action);
void addTouchRegionCommand(CLI::App& touch, Action& action);
void addTouchWatchCommand(CLI::App& touch, Action& action);

struct Feature {
    int number;
    bool enabled;
};

/// The supported ones of the features that a service usually has; none when it does not tell.
std::vector<Feature> supportedFeatures(TouchManagerClient& client);

/// Why a watch will see nothing; empty when it will.
std::string silenceOfTouch(TouchManagerClient& client);

}  // namespace pemaro::zelkctl
