// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <map>
#include <string>

namespace pemaro::test {

/// The words of each command of zelkctl, and whether others follow them; read from its command line. What its help
/// tells, tools_tests looks at.
using CommandGroups = std::map<std::string, bool>;

CommandGroups readCommands();

}  // namespace pemaro::test
