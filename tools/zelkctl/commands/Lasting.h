// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <chrono>

namespace CLI {
class App;
}

// What the commands share that last until they are told to stop.
namespace pemaro::zelkctl {

/// How soon a signal, or the service's death, is noticed.
constexpr std::chrono::milliseconds kWatchPeriod(50);

/// The option that ends such a command by itself; `seconds` stays 0 without it.
void addSecondsOption(CLI::App& command, double& seconds);

}  // namespace pemaro::zelkctl
