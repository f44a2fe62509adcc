// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <map>
#include <set>
#include <string>

namespace pemaro::test {

using WordSet = std::set<std::string>;

/// What the help of a command lists.
struct HelpEntry {
    WordSet options;   ///< long ones, with their dashes
    WordSet commands;  ///< empty for a command that does something itself
};

/// A program's command, its words separated by spaces, and what its help lists.
/// The program itself is "".
using HelpTree = std::map<std::string, HelpEntry>;

/// Asks a program of this build for its help, and for that of all its commands.
HelpTree readHelpTree(const std::string& program);

}  // namespace pemaro::test
