// SPDX-License-Identifier: Apache-2.0

/// Makes zelkctl's completions and the commands of its manual page from its command tree:
///
///     zelkctl-reference bash|zsh|man TEMPLATE OUTPUT
///
/// A line of the template that is @COMMANDS@, @OPTIONS@ or @EXIT@ gives way to what it names.

#include <android-base/file.h>
#include <fmt/core.h>

#include <CLI/CLI.hpp>
#include <algorithm>
#include <cstdio>
#include <functional>
#include <map>
#include <sstream>
#include <string>
#include <vector>

#include "tools/common/ExitStatus.h"
#include "tools/zelkctl/commands/CommandTree.h"

using pemaro::tools::ExitStatus;

namespace {

using Words = std::vector<std::string>;

std::string join(const Words& words, const char* between) {
    std::string text;
    for (const std::string& word : words) {
        text += (text.empty() ? "" : between) + word;
    }
    return text;
}

std::string replaceAll(std::string text, const std::string& what, const std::string& with) {
    for (size_t at = 0; (at = text.find(what, at)) != std::string::npos; at += with.size()) {
        text.replace(at, what.size(), with);
    }
    return text;
}

/// An option or an operand.
struct Argument {
    std::string longName;   ///< with its dashes; empty for an operand
    std::string shortName;  ///< the same
    std::string word;       ///< what stands for the value; empty for a flag
    std::string help;
    bool isRequired;
    bool isRepeated;
};

struct Entry {
    std::string path;
    std::string help;
    std::string details;
    std::vector<Argument> options;
    std::vector<Argument> operands;
    std::vector<Entry> commands;
};

Argument describe(const CLI::Option& option) {
    Argument argument;
    argument.isRequired = option.get_required();
    argument.isRepeated = option.get_items_expected_max() > 1;
    argument.help = option.get_description();
    if (option.get_positional()) {
        argument.word = option.get_name(true);
        return argument;
    }
    argument.longName = option.get_lnames().empty() ? "" : "--" + option.get_lnames()[0];
    argument.shortName = option.get_snames().empty() ? "" : "-" + option.get_snames()[0];
    // What a check adds behind a colon is for the help alone.
    const std::string type = option.get_type_name();
    argument.word = option.get_expected_max() == 0 ? "" : type.substr(0, type.find(':'));
    return argument;
}

Entry describe(const CLI::App& app, const std::string& path) {
    Entry entry{path, app.get_description(), app.get_footer(), {}, {}, {}};
    for (const CLI::Option* option : app.get_options()) {
        (option->get_positional() ? entry.operands : entry.options).push_back(describe(*option));
    }
    for (const CLI::App* command : app.get_subcommands({})) {
        // What the help does not list is nobody's to type.
        if (!command->get_group().empty()) {
            entry.commands.push_back(
                    describe(*command, path.empty() ? command->get_name()
                                                    : path + " " + command->get_name()));
        }
    }
    return entry;
}

void forEachEntry(const Entry& entry, const std::function<void(const Entry&)>& body) {
    body(entry);
    for (const Entry& command : entry.commands) {
        forEachEntry(command, body);
    }
}

std::string lastWord(const std::string& path) {
    return path.substr(path.rfind(' ') + 1);
}

// ---- bash ----

std::string quoted(const std::string& text) {
    return "'" + replaceAll(text, "'", "'\\''") + "'";
}

/// A case for each command: the words that may follow it.
std::string bashCommands(const Entry& root) {
    std::string text;
    forEachEntry(root, [&text](const Entry& entry) {
        Words commands;
        Words options;
        Words operands;
        for (const Entry& command : entry.commands) {
            commands.push_back(lastWord(command.path));
        }
        for (const Argument& option : entry.options) {
            options.push_back(option.longName);
        }
        for (const Argument& operand : entry.operands) {
            operands.push_back(operand.word + (operand.isRepeated ? "..." : ""));
        }
        text += fmt::format("    {}) commands={} options={} operands={} ;;\n", quoted(entry.path),
                            quoted(join(commands, " ")), quoted(join(options, " ")),
                            quoted(join(operands, " ")));
    });
    return text;
}

/// A case for each option that has a value: the word that stands for it. An option's name means the
/// same in all commands.
std::string bashOptions(const Entry& root) {
    std::map<std::string, std::string> words;
    forEachEntry(root, [&words](const Entry& entry) {
        for (const Argument& option : entry.options) {
            if (!option.word.empty()) {
                words.emplace(option.longName, option.word);
                words.emplace(option.shortName, option.word);
            }
        }
    });
    words.erase("");
    std::string text;
    for (const auto& [name, word] : words) {
        text += fmt::format("    {}) echo {} ;;\n", name, quoted(word));
    }
    return text;
}

// ---- zsh ----

/// As _arguments takes it between its own marks.
std::string zshText(const std::string& text) {
    std::string escaped;
    for (const char letter : text) {
        if (letter == ':' || letter == '[' || letter == ']' || letter == '\\') {
            escaped += '\\';
        }
        escaped += letter;
    }
    return escaped;
}

/// What is told of a value, and where the words for it come from.
std::string zshValue(const std::string& word) {
    return zshText(word) + ":_zelkctl_values " + replaceAll(word, "|", "\\|");
}

std::string zshOption(const Argument& option) {
    const std::string value = option.word.empty() ? "" : ":" + zshValue(option.word);
    const std::string help = "[" + zshText(option.help) + "]" + value;
    if (option.shortName.empty()) {
        return quoted(option.longName + help);
    }
    return quoted(fmt::format("({} {})", option.shortName, option.longName)) +
           fmt::format("{{{},{}}}", option.shortName, option.longName) + quoted(help);
}

/// A function for each command.
std::string zshCommands(const Entry& root) {
    std::string text;
    forEachEntry(root, [&text](const Entry& entry) {
        const std::string name =
                "_zelkctl" + (entry.path.empty() ? "" : "-" + replaceAll(entry.path, " ", "-"));
        text += name + "-words() {\n";
        if (entry.commands.empty()) {
            text += "    _zelkctl_arguments";
        } else {
            text += "    _zelkctl_commands " + name;
            for (const Entry& command : entry.commands) {
                text += " \\\n        " +
                        quoted(zshText(lastWord(command.path)) + ":" + command.help);
            }
            text += " --";
        }
        for (const Argument& option : entry.options) {
            text += " \\\n        " + zshOption(option);
        }
        size_t number = 0;
        for (const Argument& operand : entry.operands) {
            const std::string place = operand.isRepeated ? "*" : std::to_string(++number);
            text += " \\\n        " + quoted(place + ":" + zshValue(operand.word));
        }
        text += "\n}\n";
    });
    return text;
}

// ---- manual ----

/// Text within a line of mdoc: what would be a macro or an escape is none.
std::string manText(const std::string& text) {
    return replaceAll(replaceAll(text, "\\", "\\e"), "\"", "\\(dq");
}

/// Text on a line of its own.
std::string manLine(const std::string& text) {
    const bool isMacro = !text.empty() && (text[0] == '.' || text[0] == '\'');
    std::string line = (isMacro ? "\\&" : "") + manText(text);
    // A sentence ends at the end of a line.
    return replaceAll(line, ". ", ".\n");
}

std::string manOption(const Argument& option) {
    const std::string name = "Fl -" + option.longName.substr(2);
    return name + (option.word.empty() ? "" : " Ar " + manText(option.word));
}

bool isCommon(const Argument& option) {
    return option.longName == "--help" || option.longName == "--json" ||
           option.longName == "--timeout" || option.longName == "--version";
}

std::string manHeading(const Entry& entry) {
    std::string line = ".It Cm " + entry.path;
    for (const Argument& option : entry.options) {
        if (!isCommon(option)) {
            line += " Oo " + manOption(option) + " Oc";
        }
    }
    for (const Argument& operand : entry.operands) {
        const std::string word = replaceAll(operand.word, "|", " | ");
        const bool isChoice = operand.word.find('|') != std::string::npos;
        const std::string shown =
                (isChoice ? "Cm " : "Ar ") + manText(word) + (operand.isRepeated ? " ..." : "");
        line += operand.isRequired ? " " + shown : " Oo " + shown + " Oc";
    }
    return line + "\n";
}

void addOptionList(std::string& text, const std::vector<Argument>& options) {
    text += ".Bl -tag -width Ds\n";
    for (const Argument& option : options) {
        text += ".It " +
                (option.shortName.empty() ? "" : "Fl " + option.shortName.substr(1) + " , ") +
                manOption(option) + "\n" + manLine(option.help + ".") + "\n";
    }
    text += ".El\n";
}

/// An item for each command; each group of them under a heading.
std::string manCommands(const Entry& root) {
    std::string text;
    const auto addCommand = [&text](const Entry& entry) {
        text += manHeading(entry) + manLine(entry.help + ".") + "\n";
        if (!entry.details.empty()) {
            text += manLine(entry.details) + "\n";
        }
        std::vector<Argument> own;
        for (const Argument& option : entry.options) {
            if (!isCommon(option)) {
                own.push_back(option);
            }
        }
        if (!own.empty()) {
            addOptionList(text, own);
        }
    };
    text += ".Ss Commands\n.Bl -tag -width Ds\n";
    for (const Entry& entry : root.commands) {
        if (entry.commands.empty()) {
            addCommand(entry);
        }
    }
    text += ".El\n";
    for (const Entry& group : root.commands) {
        if (!group.commands.empty()) {
            text += fmt::format(".Ss {}: {}\n.Bl -tag -width Ds\n", group.path,
                                manText(group.help));
            std::for_each(group.commands.begin(), group.commands.end(), addCommand);
            text += ".El\n";
        }
    }
    return text;
}

std::string manOptions(const Entry& root) {
    std::string text;
    addOptionList(text, root.options);
    return text;
}

std::string manExit() {
    std::string text = ".Bl -tag -width Ds\n";
    for (const ExitStatus& status : pemaro::tools::kExitStatuses) {
        text += fmt::format(".It {}\n{}\n", status.status, manLine(status.meaning));
    }
    return text + ".El\n";
}

// ---- the program ----

struct Part {
    const char* kind;
    const char* mark;
    std::string (*make)(const Entry&);
};

constexpr Part kParts[] = {
        {"bash", "@COMMANDS@", bashCommands},
        {"bash", "@OPTIONS@", bashOptions},
        {"zsh", "@COMMANDS@", zshCommands},
        {"man", "@COMMANDS@", manCommands},
        {"man", "@OPTIONS@", manOptions},
        {"man", "@EXIT@", [](const Entry&) { return manExit(); }},
};

std::string fill(const std::string& pattern, const std::string& kind, const Entry& root) {
    std::istringstream lines(pattern);
    std::string text;
    for (std::string line; std::getline(lines, line);) {
        std::string made = line + "\n";
        for (const Part& part : kParts) {
            if (kind == part.kind && line == part.mark) {
                made = part.make(root);
            }
        }
        text += made;
    }
    return text;
}

int fail(const std::string& problem) {
    fmt::print(stderr, "zelkctl-reference: {}\n", problem);
    return pemaro::tools::kExitFailure;
}

}  // namespace

int main(int argc, char** argv) {
    if (argc != 4) {
        return fail("usage: zelkctl-reference bash|zsh|man TEMPLATE OUTPUT");
    }
    CLI::App app;
    pemaro::zelkctl::Action action;
    pemaro::zelkctl::addCommandTree(app, action);
    app.set_version_flag("--version", "", "Print the version and exit");
    const Entry root = describe(app, "");
    std::string pattern;
    if (!android::base::ReadFileToString(argv[2], &pattern, true)) {
        return fail(std::string("cannot read ") + argv[2]);
    }
    if (!android::base::WriteStringToFile(fill(pattern, argv[1], root), argv[3], true)) {
        return fail(std::string("cannot write ") + argv[3]);
    }
    return pemaro::tools::kExitSuccess;
}
