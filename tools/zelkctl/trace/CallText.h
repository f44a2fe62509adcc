// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <chrono>
#include <string>

#include "tools/zelkctl/trace/ProcessNames.h"
#include "tools/zelkctl/trace/TracedCall.h"

namespace pemaro::zelkctl {

/// What is called: touch.isSupported.
std::string callName(const TracedCall& call);

/// The end as one word: answered, refused, one-way, dead, undelivered, open.
const char* callEndWord(CallEnd end);

double secondsOf(int64_t nanoseconds);

std::string millisecondsText(int64_t nanoseconds);

/// One line about a call, for people or as a JSON object. `when` is the time of its request.
///
///     14:03:21.123  zelkctl 146 > zelk-touchstack 137  touch.isSupported  56 > 8 bytes  0.412 ms
std::string callLine(const TracedCall& call, std::chrono::system_clock::time_point when,
                     const Party& caller, const Party& callee);
std::string callJson(const TracedCall& call, std::chrono::system_clock::time_point when,
                     const Party& caller, const Party& callee);

}  // namespace pemaro::zelkctl
