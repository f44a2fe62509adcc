// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/terminal/Settings.h"

namespace pemaro::zelkctl {

Settings& settings() {
    static Settings instance;
    return instance;
}

}  // namespace pemaro::zelkctl
