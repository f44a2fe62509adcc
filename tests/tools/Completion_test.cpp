// SPDX-License-Identifier: Apache-2.0
// The completions know what the programs know, neither less nor more.

#include <gtest/gtest.h>

#include <algorithm>
#include <regex>
#include <string>
#include <vector>

#include "tests/support/ChildProcess.h"
#include "tests/tools/HelpTree.h"

namespace pemaro::test {

namespace {

WordSet asSet(const std::vector<std::string>& words) {
    return {words.begin(), words.end()};
}

constexpr const char* kPrograms[] = {"zelkctl", "zelk-touchstack"};

// What bash offers for the word that is typed behind others, all as bash breaks them, where readline replaces that end
// of it. The script is run before.
std::vector<std::string> completeInBash(const std::string& program, const std::string& script,
                                        const std::string& words, const std::string& typed,
                                        const std::string& replaced) {
    const RunResult result =
            run({"bash", "--norc", "-c",
                 ". " ZELK_REFERENCE_DIR "/" + program + ".bash\n" + script +
                         "\n"
                         "COMP_WORDS=(" +
                         words +
                         " \"$1\")\n"
                         "COMP_CWORD=$((${#COMP_WORDS[@]} - 1))\n_" +
                         program +
                         " \"${COMP_WORDS[0]}\" \"$2\"\n"
                         "((${#COMPREPLY[@]} == 0)) || printf '%s\\n' \"${COMPREPLY[@]}\"\n",
                 "bash", typed, replaced});
    EXPECT_EQ(0, result.status);
    EXPECT_EQ("", result.errors);
    return splitLines(result.output);
}

std::vector<std::string> completeInBash(const std::string& program, const std::string& words,
                                        const std::string& typed) {
    const bool isBreak = typed == "=" || typed == ":";
    return completeInBash(program, "", ZELK_BIN_DIR "/" + program + " " + words, typed,
                          isBreak ? "" : typed);
}

// What zsh is told of a command: the options, and the commands behind it.
HelpEntry completeInZsh(const std::string& program, const std::string& path) {
    std::string function = "_" + program + (path.empty() ? "" : "-" + path) + "-words";
    std::replace(function.begin(), function.end(), ' ', '-');
    const RunResult result = run({"zsh", "-f", "-c",
                                  "_arguments() { print -rl -- \"$@\"; state=command }\n"
                                  "_describe() { print -rl -- 'command '${(P)^@[-1]} }\n"
                                  ". " ZELK_REFERENCE_DIR "/_" +
                                          program + "\n" + function + "\n"});
    EXPECT_EQ(0, result.status) << function;
    EXPECT_EQ("", result.errors) << function;
    static const std::regex option("(?:\\([^)]*\\)|\\*)?(--[a-z-]+)\\[.*");
    static const std::regex command("command ([a-z-]+):.*");
    HelpEntry entry;
    for (const std::string& line : splitLines(result.output)) {
        std::smatch match;
        if (std::regex_match(line, match, option)) {
            entry.options.insert(match[1]);
        } else if (std::regex_match(line, match, command)) {
            entry.commands.insert(match[1]);
        }
    }
    return entry;
}

}  // namespace

TEST(BashCompletion, OffersTheCommandsAndOptionsOfTheHelp) {
    for (const char* program : kPrograms) {
        for (const auto& [path, entry] : readHelpTree(program)) {
            EXPECT_EQ(entry.options, asSet(completeInBash(program, path, "-"))) << path;
            if (!entry.commands.empty()) {
                EXPECT_EQ(entry.commands, asSet(completeInBash(program, path, ""))) << path;
            }
        }
    }
}

TEST(BashCompletion, FollowsTheCommandLine) {
    const struct {
        const char* words;
        const char* typed;
        WordSet offered;
    } rows[] = {
            {"", "rec", {"record", "record-file"}},
            {"--log", "p", {"ping", "property", "packet-size"}},
            {"gesture wakeup", "o", {"on", "off"}},
            {"gesture detect", "s", {"start", "stop"}},
            {"property set", "s", {"setRollingLogSize"}},
            {"record --frames 5", "--o", {"--output"}},
            {"record --frames", "", {}},
            {"help", "rec", {"record", "record-file"}},
            {"help session", "", {"save", "list", "restore"}},
            {"help session save", "", {}},
            {"help ping", "", {}},
            {"check", "", {"companion", "touch", "gesture", "hand"}},
            {"check touch", "h", {"hand"}},
            {"frames export frames.bin --format", "", {"png", "csv", "cells", "json"}},
            {"frames export -f", "c", {"csv", "cells"}},
            {"hand watch --event", "hand-d", {"hand-detected"}},
            {"touch features", "", {"--first", "--last", "--json", "--timeout", "--help"}},
            {"touch region", "", {}},
            {"property set setRollingLogSize", "", {}},
            {"config load",
             ZELK_TOOLS_DIR "/com",
             {ZELK_TOOLS_DIR "/common", ZELK_TOOLS_DIR "/completions"}},
            {"touch watch --output", ZELK_TOOLS_DIR "/dem", {ZELK_TOOLS_DIR "/demo"}},
            {"touch watch -o", ZELK_TOOLS_DIR "/dem", {ZELK_TOOLS_DIR "/demo"}},
            {"frames export --format", "", {"png", "csv", "cells", "json"}},
            {"frames export file -f", "c", {"csv", "cells"}},
            {"fly", "-", {"--help"}},
    };
    for (const auto& row : rows) {
        EXPECT_EQ(row.offered, asSet(completeInBash("zelkctl", row.words, row.typed))) << row.words;
    }
}

// Words that bash breaks at = and :, of which it replaces the last part alone.
TEST(BashCompletion, OffersTheValuesOfTheTouchStacksOptions) {
    const struct {
        const char* words;
        const char* typed;
        WordSet offered;
    } rows[] = {
            {"--services", "", {"companion", "touch", "gesture", "hand"}},
            {"--services", "touch,ge", {"touch,gesture"}},
            {"--fault", "ope", {"open="}},
            {"--fault", "touch.en", {"touch.enable="}},
            {"--fault open", "=", {"status:", "delay:", "die", "null"}},
            {"--fault open =", "de", {"delay:"}},
            {"--fault open=", "di", {"die"}},
            {"--fault", "open=di", {"open=die"}},
            {"--fault open = delay :", "5", {}},
            {"--fault open = die --fi", "--fi", {"--fingers"}},
            {"--source", "li", {"list"}},
            {"--source evdev", ":", {}},
            {"--replay", ZELK_TOOLS_DIR "/dem", {ZELK_TOOLS_DIR "/demo"}},
            {"--rate", "", {}},
            {"--rate 5 --lo", "--lo", {"--log", "--loop"}},
    };
    for (const auto& row : rows) {
        EXPECT_EQ(row.offered, asSet(completeInBash("zelk-touchstack", row.words, row.typed)))
                << row.words << " " << row.typed;
    }
}

// It is text of anybody's, which no shell is to run.
TEST(BashCompletion, QuotesWhatAServiceTells) {
    const struct {
        const char* words;
        const char* typed;
        const char* replaced;
        WordSet offered;
    } rows[] = {
            {"hand delete",
             "",
             "",
             {"Anna\\'s\\ hand", "\\$\\(echo\\ ran\\ \\>\\&2\\)", "\\`echo\\ ran\\ \\>\\&2\\`",
              "a\\\\b", "\\*", "so\\\"\\!"}},
            {"hand delete", "An", "An", {"Anna\\'s\\ hand"}},
            {"hand delete", "Anna\\'s\\ h", "Anna\\'s\\ h", {"Anna\\'s\\ hand"}},
            {"hand delete", "Anna\\", "Anna\\", {"Anna\\'s\\ hand"}},
            {"hand delete", "'An", "An", {"Anna'\\''s hand"}},
            {"hand delete", "\"Anna's", "Anna's", {"Anna's hand"}},
            {"hand delete", "An\"na", "na", {"na's hand"}},
            {"hand delete", "\\$", "\\$", {"\\$\\(echo\\ ran\\ \\>\\&2\\)"}},
            {"hand delete", "'$(", "$(", {"$(echo ran >&2)"}},
            {"hand delete", "\"\\$(e", "\\$(e", {"\\$(echo ran >&2)"}},
            {"hand delete", "\"$", "$", {"\\$(echo ran >&2)"}},
            {"hand delete", "\"\\`", "\\`", {"\\`echo ran >&2\\`"}},
            {"hand delete", "a", "a", {"a\\\\b"}},
            {"hand delete", "\"a", "a", {"a\\\\b"}},
            {"hand delete", "'a", "a", {"a\\b"}},
            {"hand delete", "\"s", "s", {"so\\\"\"\\!\"\""}},
            {"hand delete",
             "$(echo ran >&2)",
             "$(echo ran >&2)",
             {"\\$\\(echo\\ ran\\ \\>\\&2\\)"}},
            {"hand delete", "Otto", "Otto", {}},
            {"config set", "so", "so", {"so\\\"\\!="}},
            {"config get", "'An", "An", {"Anna'\\''s hand"}},
            {"config load",
             "\"" ZELK_TOOLS_DIR "/dem",
             ZELK_TOOLS_DIR "/dem",
             {ZELK_TOOLS_DIR "/demo"}},
            {"config load", "'" ZELK_TOOLS_DIR "'/'dem", "dem", {"demo"}},
    };
    const std::string program =
            "service() { printf '%s\\n' \"Anna's hand\" '$(echo ran >&2)' '`echo ran >&2`' 'a\\b' "
            "'*' 'so\"!'; }";
    for (const auto& row : rows) {
        EXPECT_EQ(row.offered,
                  asSet(completeInBash("zelkctl", program, std::string("service ") + row.words,
                                       row.typed, row.replaced)))
                << row.words << " " << row.typed;
    }
}

// What it is given in an array it quotes itself.
TEST(ZshCompletion, HandsOverWhatAServiceTellsAsItIs) {
    const RunResult result = run({"zsh", "-f", "-c",
                                  "zelkctl() { print -rl -- \"Anna's hand\" '$(echo ran >&2)' "
                                  "'`echo ran >&2`' '*' '-Q' }\n"
                                  "compadd() { print -r -- $@[1,-2]; print -rl -- ${(P)@[-1]} }\n"
                                  ". " ZELK_REFERENCE_DIR "/_zelkctl\n"
                                  "_zelkctl_values PROFILE\n_zelkctl_values KEY=VALUE\n"});
    EXPECT_EQ("", result.errors);
    const std::string told = "Anna's hand\n$(echo ran >&2)\n`echo ran >&2`\n*\n-Q\n";
    EXPECT_EQ("-a\n" + told + "-S = -a\n" + told, result.output);
}

TEST(ZshCompletion, OffersTheValuesOfTheTouchStacksOptions) {
    const struct {
        const char* word;
        const char* typed;
        WordSet offered;
    } rows[] = {
            {"SERVICES", "", {"companion", "touch", "gesture", "hand"}},
            {"FAULT", "open=", {"status:", "delay:", "die", "null"}},
            {"SOURCE", "", {"list"}},
    };
    for (const auto& row : rows) {
        // What is typed is behind the mark that compset looks for, or is not.
        const RunResult result =
                run({"zsh", "-f", "-c",
                     "PATH=" ZELK_BIN_DIR ":$PATH\n"
                     "compset() { [[ " +
                             std::string("'") + row.typed +
                             "' == ${~@[-1]} ]] }\n"
                             "compadd() { print -rl -- ${(P)@[-1]} }\n"
                             ". " ZELK_REFERENCE_DIR "/_zelk-touchstack\n_zelk-touchstack_values " +
                             row.word + "\n"});
        EXPECT_EQ("", result.errors) << row.word;
        EXPECT_EQ(row.offered, asSet(splitLines(result.output))) << row.word;
    }
}

TEST(ZshCompletion, OffersTheCommandsBehindThoseThatHelpIsAskedFor) {
    const struct {
        const char* words;
        const char* offered;
    } rows[] = {
            {"help session ''", "save list restore"},
            {"help --json session ''", "save list restore"},
            {"help session save ''", ""},
            {"help ping ''", ""},
    };
    for (const auto& row : rows) {
        const RunResult result = run({"zsh", "-f", "-c",
                                      "_arguments() { print -r -- arguments }\n"
                                      "_describe() { print -r -- ${${(P)^@[-1]}%%:*} }\n"
                                      ". " ZELK_REFERENCE_DIR "/_zelkctl\n"
                                      "words=(" +
                                              std::string(row.words) +
                                              ")\nCURRENT=$#words\n_zelkctl_values COMMAND\n"});
        EXPECT_EQ("", result.errors) << row.words;
        EXPECT_EQ(row.offered, result.output.substr(0, result.output.find('\n'))) << row.words;
    }
}

TEST(ZshCompletion, OffersTheCommandsAndOptionsOfTheHelp) {
    for (const char* program : kPrograms) {
        for (const auto& [path, entry] : readHelpTree(program)) {
            const HelpEntry offered = completeInZsh(program, path);
            EXPECT_EQ(entry.options, offered.options) << path;
            EXPECT_EQ(entry.commands, offered.commands) << path;
        }
    }
}

}  // namespace pemaro::test
