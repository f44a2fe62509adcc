// SPDX-License-Identifier: Apache-2.0
// The manual pages tell what the programs' help lists, neither less nor more.

#include <gtest/gtest.h>

#include <fstream>
#include <map>
#include <regex>
#include <sstream>
#include <string>

#include "tests/support/ChildProcess.h"
#include "tests/tools/HelpTree.h"

namespace pemaro::test {

namespace {

std::ifstream openPage(const std::string& name) {
    std::ifstream page(ZELK_REFERENCE_DIR "/" + name);
    EXPECT_TRUE(page.is_open()) << name;
    return page;
}

void addOptions(const std::string& line, WordSet& options) {
    static const std::regex option("Fl -([a-z-]+)");
    for (std::sregex_iterator next(line.begin(), line.end(), option), end; next != end; ++next) {
        options.insert("--" + (*next)[1].str());
    }
}

// The commands of a page, each with the options of its heading.
std::map<std::string, WordSet> documentedCommands(const std::string& name) {
    static const std::regex heading("\\.It Cm ([a-z-]+(?: [a-z-]+)?)(?: .*)?");
    std::map<std::string, WordSet> commands;
    std::ifstream page = openPage(name);
    for (std::string line; std::getline(page, line);) {
        std::smatch match;
        if (std::regex_match(line, match, heading)) {
            WordSet& options = commands[match[1]];
            EXPECT_TRUE(options.empty()) << match[1] << " is there twice";
            // Told once, of all commands.
            options.insert({"--help", "--json", "--timeout"});
            addOptions(line, options);
        }
    }
    return commands;
}

// The options that have an item of their own.
WordSet documentedOptions(const std::string& name) {
    WordSet options;
    std::ifstream page = openPage(name);
    for (std::string line; std::getline(page, line);) {
        if (line.rfind(".It Fl ", 0) == 0) {
            addOptions(line, options);
        }
    }
    return options;
}

// A page as it is read, with a blank between its words.
std::string shownPage(const std::string& name) {
    const RunResult shown = run({"bash", "-o", "pipefail", "-c",
                                 "mandoc -T ascii " ZELK_REFERENCE_DIR "/" + name + " | col -b"});
    EXPECT_EQ(0, shown.status) << shown.errors;
    std::istringstream stream(shown.output);
    std::string text;
    for (std::string word; stream >> word;) {
        text += word + " ";
    }
    return text;
}

}  // namespace

TEST(ManPage, OfZelkctlTellsEachCommandWithItsOptions) {
    std::map<std::string, WordSet> listed;
    for (const auto& [path, entry] : readHelpTree("zelkctl")) {
        if (entry.commands.empty()) {
            listed[path] = entry.options;
        }
    }
    EXPECT_EQ(listed, documentedCommands("zelkctl.1"));
}

TEST(ManPage, OfZelkctlExplainsTheOptionsOfTheProgram) {
    const WordSet documented = documentedOptions("zelkctl.1");
    const HelpTree tree = readHelpTree("zelkctl");
    for (const char* path : {"", "record", "record-file", "touch watch"}) {
        for (const std::string& option : tree.at(path).options) {
            EXPECT_EQ(1u, documented.count(option)) << path << " " << option;
        }
    }
}

TEST(ManPage, OfZelkctlPutsWhatMayBeLeftOutBetweenBrackets) {
    const std::string page = shownPage("zelkctl.1");
    for (const char* heading :
         {"frames export --format png|csv|cells|json [--output FILE] [--first NUMBER]",
          "frames report --output FILE [--every NUMBER] FILE", "status [NUMBER]"}) {
        EXPECT_NE(std::string::npos, page.find(heading)) << heading;
    }
}

TEST(ManPage, OfTheTouchStackTellsEachOption) {
    EXPECT_EQ(readHelpTree("zelk-touchstack").at("").options,
              documentedOptions("zelk-touchstack.1"));
}

TEST(ManPage, OfTheTouchStackTellsWhatTheHelpTells) {
    const std::string page = shownPage("zelk-touchstack.1");
    // An option's line holds its words, behind two blanks, or the next one does.
    static const std::regex words("(?:  -.*?  | {20,})\\s*([A-Z].*)");
    int texts = 0;
    for (const std::string& line :
         splitLines(run({ZELK_BIN_DIR "/zelk-touchstack", "-h"}).output)) {
        std::smatch match;
        if (std::regex_match(line, match, words)) {
            EXPECT_NE(std::string::npos, page.find(match[1].str() + ".")) << line;
            ++texts;
        }
    }
    EXPECT_EQ(readHelpTree("zelk-touchstack").at("").options.size(), static_cast<size_t>(texts));
    for (const char* text :
         {"--rate NUMBER Frames a second; 0 is as fast as the client takes them. "
          "The default is 240. Excludes --replay.",
          "--loop Play it again and again. Needs --replay."}) {
        EXPECT_NE(std::string::npos, page.find(text)) << text;
    }
}

}  // namespace pemaro::test
