// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>
#include <vector>

namespace pemaro::tools {

/// The one of the words that was most likely meant by a mistyped one; empty when none is near.
std::string nearestWord(const std::string& typed, const std::vector<std::string>& words);

/// What a message about a mistyped word ends with: "; did you mean 'ping'?", or nothing.
std::string nearestWordHint(const std::string& typed, const std::vector<std::string>& words);

}  // namespace pemaro::tools
