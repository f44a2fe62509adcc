// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>
#include <vector>

#include "tests/values/reference/ReferenceTree.h"

namespace pemaro::reference {

/// What reading a text comes to.
struct Reading {
    bool aborts = false;  ///< an empty scalar ends the process; nothing else counts then
    int status = 0;
    Tree tree;  ///< when status is 0
    std::vector<std::string> messages;
    /// Whether a text ended while white space was skipped, which is believed to be impossible.
    bool endedInSpace = false;
};

/// Read a text the slow and obvious way: each nested container is cut out and read by itself, each
/// search is a loop of its own. Takes time quadratic in the text and stack in its depth.
Reading readMap(const std::string& text);
Reading readArray(const std::string& text);

}  // namespace pemaro::reference
