// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>

namespace pemaro::reference {

enum class As { kMap, kArray };

/// How the library's reader and writer did with a text, beside the reference.
struct Comparison {
    bool aborts = false;        ///< the reference aborts: the library was not run
    bool accepted = false;      ///< the text was read
    bool endedInSpace = false;  ///< see Reading
    std::string difference;     ///< empty when all agrees
};

/// Reads `text` with both, as a map or as an array, and compares status, contents, log lines and
/// the text that is written of the contents; after a failure, that the target is as it was. What
/// was recorded of the log before is gone then.
Comparison compare(const std::string& text, As as);

}  // namespace pemaro::reference
