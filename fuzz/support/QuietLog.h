// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <functional>

namespace pemaro::fuzz {

// A fuzzer that links QuietLog.cpp has a log of its own: lines are formatted and dropped, and a fatal
// assertion ends the process as on a device.

/// Calls `hook` at each line that is logged, but not while it runs: a way into the middle of an
/// operation. For fuzzers of one thread.
void onLogLine(std::function<void()> hook);

}  // namespace pemaro::fuzz
