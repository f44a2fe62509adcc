// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/commands/Lasting.h"

#include <CLI/CLI.hpp>

namespace pemaro::zelkctl {

void addSecondsOption(CLI::App& command, double& seconds) {
    command.add_option("-s,--seconds", seconds, "End after so many seconds")
            ->check(CLI::Range(0.001, 1e6));
}

}  // namespace pemaro::zelkctl
