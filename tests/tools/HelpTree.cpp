// SPDX-License-Identifier: Apache-2.0
#include "tests/tools/HelpTree.h"

#include <gtest/gtest.h>

#include <regex>
#include <sstream>
#include <vector>

#include "tests/support/ChildProcess.h"

namespace pemaro::test {

namespace {

HelpEntry parseHelp(const std::string& help) {
    // An entry is indented by two spaces, what belongs to one by more.
    static const std::regex option("  (?:-[a-z],)?(--[a-z-]+)(?: .*)?");
    static const std::regex command("  ([a-z][a-z-]*) .*");
    HelpEntry entry;
    std::string section;
    for (const std::string& line : splitLines(help)) {
        std::smatch match;
        if (!line.empty() && line[0] != ' ') {
            section = line;
        } else if (section == "Options:" && std::regex_match(line, match, option)) {
            entry.options.insert(match[1]);
        } else if (section == "Subcommands:" && std::regex_match(line, match, command)) {
            entry.commands.insert(match[1]);
        }
    }
    return entry;
}

void readInto(HelpTree& tree, const std::string& program, const std::string& path) {
    std::vector<std::string> words = {ZELK_BIN_DIR "/" + program};
    std::istringstream stream(path);
    for (std::string word; stream >> word;) {
        words.push_back(word);
    }
    words.emplace_back("--help");
    const RunResult result = run(words);
    EXPECT_EQ(0, result.status) << path;
    const HelpEntry entry = parseHelp(result.output);
    EXPECT_EQ(1u, entry.options.count("--help")) << result.output;
    tree[path] = entry;
    for (const std::string& command : entry.commands) {
        readInto(tree, program, path.empty() ? command : path + " " + command);
    }
}

}  // namespace

HelpTree readHelpTree(const std::string& program) {
    HelpTree tree;
    readInto(tree, program, "");
    return tree;
}

}  // namespace pemaro::test
