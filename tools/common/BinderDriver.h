// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>

namespace pemaro::tools {

/// Why this process cannot use Binder, in one sentence, or the empty string when it can: the driver
/// opens and a service manager answers. To be asked before anything else touches Binder, because the
/// platform ends a process that finds no driver and waits for ever for a service manager.
std::string binderProblem();

}  // namespace pemaro::tools
