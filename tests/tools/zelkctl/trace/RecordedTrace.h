// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "tools/zelkctl/trace/BinderEvent.h"

namespace pemaro::zelkctl {

/// Events as the kernel prints them, a line each, of a machine on which the simulated stack ran:
///
///     zelkctl-147 [001] 19.546165: binder_transaction: transaction=49 dest_node=6 dest_proc=137 …
///
/// The times are seconds. What begins with # is left out.
std::vector<BinderEvent> readEventLines(const std::string& text);

}  // namespace pemaro::zelkctl
