// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <chrono>
#include <string>
#include <vector>

namespace pemaro::zelkctl {

/// A name as it can be printed on one line: each control character becomes a question mark.
std::string printable(std::string name);

/// Several words with commas between.
std::string joined(const std::vector<std::string>& words);

/// A local time as it stands in front of a line, to the millisecond: 14:03:21.123.
std::string timeOfDay(std::chrono::system_clock::time_point when);

}  // namespace pemaro::zelkctl
