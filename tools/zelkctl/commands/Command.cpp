// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/commands/Command.h"

#include <CLI/CLI.hpp>
#include <algorithm>
#include <utility>

#include "tools/common/NearestWord.h"
#include "tools/common/Number.h"
#include "tools/zelkctl/terminal/Settings.h"

namespace pemaro::zelkctl {
namespace {

constexpr tools::DecimalRange kTimeouts{0.001, 1e6};

std::string join(const std::vector<std::string>& words) {
    std::string name;
    for (const std::string& word : words) {
        name += (name.empty() ? "" : "|") + word;
    }
    return name;
}

std::function<std::string(const std::string&)> isOneOf(const std::vector<std::string>& words) {
    return [words](const std::string& typed) {
        const bool known = std::find(words.begin(), words.end(), typed) != words.end();
        const std::string none = words.size() == 2 ? "neither of them" : "none of " + join(words);
        return known ? "" : "'" + typed + "' is " + none + tools::nearestWordHint(typed, words);
    };
}

}  // namespace

Command::Command(CLI::App& app, Action& action, const std::string& name, const std::string& help)
        : mApp(app.add_subcommand(name, help)), mAction(action) {}

Command& Command::details(const std::string& text) {
    mApp->footer(text);
    return *this;
}

Command& Command::hidden() {
    mApp->group("");
    return *this;
}

Command& Command::operand(const char* word, std::string& value, const std::string& help) {
    mApp->add_option(word, value, help)->required();
    return *this;
}

Command& Command::operand(const char* word, std::optional<std::string>& value,
                          const std::string& help) {
    mApp->add_option(
            word,
            [&value](const CLI::results_t& words) {
                value = words[0];
                return true;
            },
            help);
    return *this;
}

Command& Command::operands(const char* word, std::vector<std::string>& values,
                           const std::string& help, int least) {
    mApp->add_option(word, values, help)->required(least > 0);
    return *this;
}

Command& Command::choice(std::string& value, const std::vector<std::string>& words,
                         const std::string& help) {
    mApp->add_option(join(words), value, help)->required()->check(isOneOf(words), "");
    return *this;
}

Command& Command::choiceOption(const char* names, std::string& value,
                               const std::vector<std::string>& words, const std::string& help) {
    mApp->add_option(names, value, help)->type_name(join(words))->check(isOneOf(words), "");
    return *this;
}

Command& Command::addNumber(const char* name, const std::string& help, tools::NumberRange range,
                            std::function<void(int64_t)> store) {
    const auto take = [store = std::move(store), range](const CLI::results_t& words) {
        const auto number = tools::parseNumber(words[0], range);
        if (number) {
            store(*number);
        }
        return number.has_value();
    };
    const auto check = [range](const std::string& text) {
        return tools::numberProblem(text, range);
    };
    const bool isOption = name[0] == '-';
    CLI::Option* option = mApp->add_option(name, take, help)->check(check, "");
    option->type_name(isOption ? "NUMBER" : "")->required(!isOption);
    return *this;
}

Command& Command::option(const char* names, const char* word, std::string& value,
                         const std::string& help) {
    mApp->add_option(names, value, help)->type_name(word);
    return *this;
}

Command& Command::parsed(const char* names, const char* word, const std::string& help,
                         std::function<std::string(const std::string& text)> take) {
    mApp->add_option(
                names, [](const CLI::results_t&) { return true; }, help)
            ->type_name(word)
            ->check(std::move(take), "");
    return *this;
}

Command& Command::decimal(const char* names, const char* word, double& value,
                          const std::string& help, tools::DecimalRange range) {
    mApp->add_option(names, value, help)
            ->type_name(word)
            ->check([range](const std::string& text) { return tools::decimalProblem(text, range); },
                    "");
    return *this;
}

Command& Command::flag(const char* names, bool& value, const std::string& help) {
    mApp->add_flag(names, value, help);
    return *this;
}

Command& Command::required(const char* name) {
    mApp->get_option(name)->required();
    return *this;
}

Command& Command::excludes(const char* one, const char* other) {
    mApp->get_option(one)->excludes(mApp->get_option(other));
    return *this;
}

Command& Command::check(std::function<std::string()> problem) {
    mCheck = std::move(problem);
    return *this;
}

void Command::runs(Action run) {
    // Behind its own ones.
    addCommonOptions(*mApp);
    mApp->callback([check = std::move(mCheck), run = std::move(run), &action = mAction] {
        const std::string problem = check ? check() : "";
        if (!problem.empty()) {
            throw CLI::ValidationError(problem);
        }
        action = run;
    });
}

void addCommonOptions(CLI::App& app) {
    // Bound by hand: a command that was not named must not undo what zelkctl itself was told.
    app.add_flag_function(
            "--json", [](int64_t) { settings().json = true; },
            "Print results and errors as JSON, one object a line");
    app.add_option(
               "--timeout",
               [](const CLI::results_t& words) {
                   settings().timeout = tools::parseDecimal(words[0], kTimeouts).value_or(0);
                   return true;
               },
               "Give a call up after so many seconds, and exit with 4")
            ->type_name("SECONDS")
            ->check([](const std::string& text) { return tools::decimalProblem(text, kTimeouts); },
                    "");
}

CLI::App& addGroup(CLI::App& app, const char* name, const char* help) {
    CLI::App* group = app.add_subcommand(name, help);
    group->require_subcommand(0, 1);
    return *group;
}

}  // namespace pemaro::zelkctl
