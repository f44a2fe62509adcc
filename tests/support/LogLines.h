// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>
#include <vector>

namespace pemaro::test {

using Lines = std::vector<std::string>;

/// What LogRecorder has recorded under `tag`, each line as the letter of its priority and its text:
/// "D Bp::open", "E init() error: Broken pipe".
Lines linesOf(const std::string& tag);

/// `format`, a text with one %p, as it is logged with `address`.
std::string withAddress(const char* format, const void* address);

/// The recorder begins anew.
void clearLog();

}  // namespace pemaro::test
