// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/commands/Lasting.h"

namespace pemaro::zelkctl {

void addSecondsOption(Command& command, double& seconds) {
    command.decimal("-s,--seconds", "SECONDS", seconds, "End after so many seconds", {0.001, 1e6});
}

}  // namespace pemaro::zelkctl
