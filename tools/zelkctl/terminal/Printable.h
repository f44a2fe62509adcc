// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>

namespace pemaro::zelkctl {

/// A name as it can be printed on one line: each control character becomes a question mark.
std::string printable(std::string name);

}  // namespace pemaro::zelkctl
