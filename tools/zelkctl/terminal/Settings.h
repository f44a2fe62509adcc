// SPDX-License-Identifier: Apache-2.0
#pragma once

namespace pemaro::zelkctl {

/// What the command line chose for the whole process; not changed once the command runs.
struct Settings {
    bool json = false;
    bool log = false;
    double timeout = 0;  ///< seconds for each call; 0: any number
};

Settings& settings();

}  // namespace pemaro::zelkctl
