// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <CLI/CLI.hpp>
#include <chrono>

// What the commands share that last until they are told to stop.
namespace pemaro::zelkctl {

/// How soon a signal, or the service's death, is noticed.
constexpr std::chrono::milliseconds kWatchPeriod(50);

/// The option that ends such a command by itself; `seconds` stays 0 without it.
inline void addSecondsOption(CLI::App& command, double& seconds) {
    command.add_option("-s,--seconds", seconds, "End after so many seconds")
            ->check(CLI::Range(0.001, 1e6));
}

}  // namespace pemaro::zelkctl
