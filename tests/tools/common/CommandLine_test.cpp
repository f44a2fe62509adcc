// SPDX-License-Identifier: Apache-2.0
#include "tools/common/CommandLine.h"

#include <gtest/gtest.h>

#include <CLI/CLI.hpp>
#include <optional>
#include <string>
#include <vector>

namespace pemaro::tools {

namespace {

using Words = std::vector<std::string>;

// A program with an option, a flag, and two commands that take operands.
struct Program {
    std::string name;
    bool verbose = false;
    Words values;
    std::string first;
    std::string second;
    std::string problem;

    std::optional<int> parse(Words words) {
        words.insert(words.begin(), "program");
        std::vector<char*> arguments;
        for (std::string& word : words) {
            arguments.push_back(word.data());
        }
        CLI::App app;
        app.add_option("-n,--name", name);
        app.add_flag("-v,--verbose", verbose);
        app.require_subcommand(0, 1);
        app.add_subcommand("get")->add_option("VALUE", values)->required();
        CLI::App* move = app.add_subcommand("move");
        move->add_option("FIRST", first)->required();
        move->add_option("SECOND", second);
        return parseCommandLine(app, static_cast<int>(arguments.size()), arguments.data(), nullptr,
                                [this](const std::string& told) { problem = told; });
    }
};

}  // namespace

TEST(CommandLine, HandsOnWhatWasTyped) {
    // The parser has a syntax of its own for each of these.
    for (const char* word :
         {"++",   "[x]", "[a=b]", "[a,b]", "[[a]]", "[",   "[]",    "{}",  "%%", "get",
          "move", "a,b", "/v",    "-",     "-5",    "-.5", "\"a\"", "'a'", "\1", "\1a"}) {
        Program several;
        EXPECT_EQ(std::nullopt, several.parse({"get", word, "and", word, word})) << word;
        EXPECT_EQ((Words{word, "and", word, word}), several.values) << several.problem;
        Program two;
        EXPECT_EQ(std::nullopt, two.parse({"move", word, word})) << word;
        EXPECT_EQ(word, two.first);
        EXPECT_EQ(word, two.second) << two.problem;
        for (const Words& option :
             {Words{"-n", word}, Words{"--name", word}, Words{std::string("--name=") + word},
              Words{std::string("-n") + word}}) {
            Program program;
            EXPECT_EQ(std::nullopt, program.parse(option)) << option[0];
            EXPECT_EQ(word, program.name) << program.problem;
        }
    }
}

TEST(CommandLine, TakesNoWordForAnOptionBehindTwoDashes) {
    const struct {
        Words words;
        Words values;
        bool verbose;
    } rows[] = {
            {{"--", "get", "a"}, {"a"}, false},
            {{"get", "--", "a", "b"}, {"a", "b"}, false},
            {{"get", "a", "--", "b"}, {"a", "b"}, false},
            {{"-v", "get", "--", "-v"}, {"-v"}, true},
            {{"get", "--", "--verbose", "--"}, {"--verbose", "--"}, false},
    };
    for (const auto& row : rows) {
        Program program;
        EXPECT_EQ(std::nullopt, program.parse(row.words)) << program.problem;
        EXPECT_EQ(row.values, program.values);
        EXPECT_EQ(row.verbose, program.verbose);
    }
}

TEST(CommandLine, RefusesAValueOfAFlag) {
    for (const Words& words : {Words{"--verbose=false"}, Words{"--verbose=nonsense"},
                               Words{"--verbose="}, Words{"--verbose=true", "get", "a"}}) {
        Program program;
        EXPECT_EQ(kExitUsage, program.parse(words)) << words[0];
        EXPECT_EQ("--verbose: it takes no value", program.problem);
        EXPECT_FALSE(program.verbose);
    }
    for (const char* word : {"-vn", "-v1", "-v=1"}) {
        Program program;
        EXPECT_EQ(kExitUsage, program.parse({word})) << word;
        EXPECT_EQ("-v: it takes no value", program.problem);
    }
}

}  // namespace pemaro::tools
