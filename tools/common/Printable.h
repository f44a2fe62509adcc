// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>

namespace pemaro::tools {

/// A text as it can be printed on one line: each control character becomes a question mark.
std::string printable(std::string text);

}  // namespace pemaro::tools
