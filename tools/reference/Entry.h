// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <functional>
#include <string>
#include <vector>

namespace CLI {
class App;
}

namespace pemaro::reference {

using Words = std::vector<std::string>;

/// An option or an operand.
struct Argument {
    std::string longName;   ///< with its dashes; empty for an operand
    std::string shortName;  ///< the same
    std::string word;       ///< what stands for the value; empty for a flag
    std::string help;
    bool isRequired;
    bool isRepeated;
    std::string standard;  ///< the value of an option that is not told
    Words excludes;        ///< names of options
    Words needs;
};

/// A program, or a command of one.
struct Entry {
    std::string path;  ///< the words of a command; empty for the program
    std::string help;
    std::string details;
    std::vector<Argument> options;
    std::vector<Argument> operands;
    std::vector<Entry> commands;
};

/// What a command line consists of.
Entry describe(const CLI::App& app, const std::string& path = "");

/// Calls `body` with the entry and all those below it.
void forEachEntry(const Entry& entry, const std::function<void(const Entry&)>& body);

std::string join(const Words& words, const char* between);
std::string replaceAll(std::string text, const std::string& what, const std::string& with);

}  // namespace pemaro::reference
