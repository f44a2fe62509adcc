// SPDX-License-Identifier: Apache-2.0
#include <fmt/core.h>

#include "tools/reference/Parts.h"

namespace pemaro::reference {
namespace {

std::string lastWord(const std::string& path) {
    return path.substr(path.rfind(' ') + 1);
}

std::string quoted(const std::string& text) {
    return "'" + replaceAll(text, "'", "'\\''") + "'";
}

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
std::string zshValue(const Program& program, const std::string& word) {
    return fmt::format("{}:_{}_values {}", zshText(word), program.name,
                       replaceAll(word, "|", "\\|"));
}

std::string zshOption(const Program& program, const Argument& option) {
    const std::string value = option.word.empty() ? "" : ":" + zshValue(program, option.word);
    const std::string help = "[" + zshText(option.help) + "]" + value;
    if (option.shortName.empty()) {
        return quoted((option.isRepeated ? "*" : "") + option.longName + help);
    }
    return quoted(fmt::format("({} {})", option.shortName, option.longName)) +
           fmt::format("{{{},{}}}", option.shortName, option.longName) + quoted(help);
}

}  // namespace

/// A case for each command: the words that may follow it.
std::string bashCommands(const Program& program) {
    std::string text;
    forEachEntry(program.root, [&text](const Entry& entry) {
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
std::string bashOptions(const Program& program) {
    std::map<std::string, std::string> words;
    forEachEntry(program.root, [&words](const Entry& entry) {
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

/// A function for each command.
std::string zshCommands(const Program& program) {
    std::string text;
    const std::string prefix = "_" + program.name;
    forEachEntry(program.root, [&](const Entry& entry) {
        const std::string name =
                prefix + (entry.path.empty() ? "" : "-" + replaceAll(entry.path, " ", "-"));
        text += name + "-words() {\n";
        if (entry.commands.empty()) {
            text += "    " + prefix + "_arguments";
        } else {
            text += "    " + prefix + "_commands " + name;
            for (const Entry& command : entry.commands) {
                text += " \\\n        " +
                        quoted(zshText(lastWord(command.path)) + ":" + command.help);
            }
            text += " --";
        }
        for (const Argument& option : entry.options) {
            text += " \\\n        " + zshOption(program, option);
        }
        size_t number = 0;
        for (const Argument& operand : entry.operands) {
            const std::string place = operand.isRepeated ? "*" : std::to_string(++number);
            text += " \\\n        " + quoted(place + ":" + zshValue(program, operand.word));
        }
        text += "\n}\n";
    });
    return text;
}

std::string shellValues(const Program& program) {
    std::string text;
    for (const auto& [word, values] : program.values) {
        text += fmt::format("    {}) echo {} ;;\n", word, quoted(join(values, " ")));
    }
    return text;
}

}  // namespace pemaro::reference
