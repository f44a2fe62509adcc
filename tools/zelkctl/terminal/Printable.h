// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <chrono>
#include <string>
#include <vector>

#include "tools/common/Printable.h"

namespace pemaro::zelkctl {

using tools::printable;

/// Several words with commas between.
std::string joined(const std::vector<std::string>& words);

/// A local time as it stands in front of a line, to the millisecond: 14:03:21.123.
std::string timeOfDay(std::chrono::system_clock::time_point when);

}  // namespace pemaro::zelkctl
