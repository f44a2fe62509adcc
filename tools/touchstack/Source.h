// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <memory>
#include <string>

#include "simulator/touchscreen/TouchScreen.h"

namespace pemaro::touchstack {

// What --source names: "evdev:/dev/input/event3", a touch screen whose fingers are drawn, or "list".

/// What is wrong with it; empty for what it may be.
std::string sourceProblem(const std::string& source);

/// Prints a line for each touch screen that there is, as --source takes it; the exit status.
int listSources();

/// Null when there is no source, or, with a sentence about why, when it cannot be used.
std::shared_ptr<simulator::TouchScreen> openSource(const std::string& source, std::string* problem);

/// A line about it.
std::string describeSource(const simulator::TouchScreen& screen);

}  // namespace pemaro::touchstack
