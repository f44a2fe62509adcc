// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <chrono>

#include "tools/zelkctl/commands/Command.h"

// What the commands share that last until they are told to stop.
namespace pemaro::zelkctl {

/// How soon the service's death, or a request to stop, is noticed.
constexpr std::chrono::milliseconds kWatchPeriod(50);

/// The option that ends such a command by itself; `seconds` stays 0 without it.
void addSecondsOption(Command& command, double& seconds);

}  // namespace pemaro::zelkctl
