// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>
#include <vector>

namespace pemaro::zelkctl {

/// A name as it can be printed on one line: each control character becomes a question mark.
std::string printable(std::string name);

/// Several words with commas between.
std::string joined(const std::vector<std::string>& words);

}  // namespace pemaro::zelkctl
