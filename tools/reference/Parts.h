// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <map>
#include <string>

#include "tools/reference/Entry.h"

namespace pemaro::reference {

/// A program whose reference is made.
struct Program {
    std::string name;
    Entry root;
    /// For a word that stands for a value: all values, where they are known before it runs.
    std::map<std::string, Words> values;
};

// What takes the place of the marks in the templates.

// The words that may follow a command, and the word that stands for an option's value.
std::string bashCommands(const Program& program);
std::string bashOptions(const Program& program);
/// What zsh's _arguments is told of each command.
std::string zshCommands(const Program& program);
/// The values that are known, for both shells.
std::string shellValues(const Program& program);

std::string manCommands(const Program& program);
std::string manOptions(const Program& program);
std::string manExit(const Program& program);

}  // namespace pemaro::reference
