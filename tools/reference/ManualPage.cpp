// SPDX-License-Identifier: Apache-2.0
#include <fmt/core.h>

#include <algorithm>

#include "tools/common/ExitStatus.h"
#include "tools/reference/Parts.h"

namespace pemaro::reference {
namespace {

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

/// Between brackets, unless it has to be there.
std::string manWanted(const Argument& argument, const std::string& shown) {
    return argument.isRequired ? " " + shown : " Oo " + shown + " Oc";
}

std::string manHeading(const Entry& entry) {
    std::string line = ".It Cm " + entry.path;
    for (const Argument& option : entry.options) {
        if (!isCommon(option)) {
            line += manWanted(option, manOption(option));
        }
    }
    for (const Argument& operand : entry.operands) {
        const std::string word = replaceAll(operand.word, "|", " | ");
        const bool isChoice = operand.word.find('|') != std::string::npos;
        const std::string shown =
                (isChoice ? "Cm " : "Ar ") + manText(word) + (operand.isRepeated ? " ..." : "");
        line += manWanted(operand, shown);
    }
    return line + "\n";
}

/// Options that may not, or must, be told as well.
std::string manOthers(const char* relation, const Words& names) {
    Words flags;
    for (const std::string& name : names) {
        flags.push_back(name.substr(1));
    }
    return names.empty() ? "" : fmt::format("{}\n.Fl {} .\n", relation, join(flags, " , "));
}

void addOptionList(std::string& text, const std::vector<Argument>& options) {
    text += ".Bl -tag -width Ds\n";
    for (const Argument& option : options) {
        text += ".It " +
                (option.shortName.empty() ? "" : "Fl " + option.shortName.substr(1) + " , ") +
                manOption(option) + "\n" + manLine(option.help + ".") + "\n";
        if (!option.standard.empty()) {
            text += manLine("The default is " + option.standard + ".") + "\n";
        }
        text += manOthers("Excludes", option.excludes) + manOthers("Needs", option.needs);
    }
    text += ".El\n";
}

}  // namespace

/// An item for each command; each group of them under a heading.
std::string manCommands(const Program& program) {
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
    for (const Entry& entry : program.root.commands) {
        if (entry.commands.empty()) {
            addCommand(entry);
        }
    }
    text += ".El\n";
    for (const Entry& group : program.root.commands) {
        if (!group.commands.empty()) {
            text += fmt::format(".Ss {}: {}\n.Bl -tag -width Ds\n", group.path,
                                manText(group.help));
            std::for_each(group.commands.begin(), group.commands.end(), addCommand);
            text += ".El\n";
        }
    }
    return text;
}

std::string manOptions(const Program& program) {
    std::string text;
    addOptionList(text, program.root.options);
    return text;
}

std::string manExit(const Program& /* program */) {
    std::string text = ".Bl -tag -width Ds\n";
    for (const tools::ExitStatus& status : tools::kExitStatuses) {
        text += fmt::format(".It {}\n{}\n", status.status, manLine(status.meaning));
    }
    return text + ".El\n";
}

}  // namespace pemaro::reference
