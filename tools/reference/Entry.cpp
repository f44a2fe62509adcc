// SPDX-License-Identifier: Apache-2.0
#include "tools/reference/Entry.h"

#include <CLI/CLI.hpp>
#include <algorithm>
#include <set>

namespace pemaro::reference {
namespace {

Words namesOf(const std::set<CLI::Option*>& options) {
    Words names;
    for (const CLI::Option* option : options) {
        names.push_back(option->get_name());
    }
    std::sort(names.begin(), names.end());
    return names;
}

Argument describeArgument(const CLI::Option& option) {
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
    argument.standard = option.get_default_str();
    argument.excludes = namesOf(option.get_excludes());
    argument.needs = namesOf(option.get_needs());
    // What a check adds behind a colon is for the help alone.
    const std::string type = option.get_type_name();
    argument.word = option.get_expected_max() == 0 ? "" : type.substr(0, type.find(':'));
    return argument;
}

}  // namespace

Entry describe(const CLI::App& app, const std::string& path) {
    Entry entry{path, app.get_description(), app.get_footer(), {}, {}, {}};
    for (const CLI::Option* option : app.get_options()) {
        (option->get_positional() ? entry.operands : entry.options)
                .push_back(describeArgument(*option));
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

}  // namespace pemaro::reference
