// SPDX-License-Identifier: Apache-2.0
#pragma once

namespace CLI {
class App;
}

namespace pemaro::zelkctl {

/// The options that zelkctl itself and all commands have; they fill in the settings.
void addCommonOptions(CLI::App& app);

}  // namespace pemaro::zelkctl
