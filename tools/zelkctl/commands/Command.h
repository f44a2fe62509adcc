// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstdint>
#include <functional>
#include <limits>
#include <optional>
#include <string>
#include <vector>

#include "tools/common/Number.h"

namespace CLI {
class App;
}

namespace pemaro::zelkctl {

/// What a command does once the command line is known to be right; returns the exit status.
using Action = std::function<int()>;

/// A command while it is described: its operands and options in the order in which the help lists
/// them, and what it does. Every command has --json and --timeout besides.
///
/// An operand or option fills in a variable, which has to live as long as the command tree: those
/// that an Action refers to are kept by it.
///
///     auto options = std::make_shared<Options>();
///     Command(app, action, "rename", "Give a profile another name")
///             .operand("PROFILE", options->first, "The current name")
///             .operand("NAME", options->second, "The new name")
///             .runs([options] { return rename(*options); });
///
/// The word of an operand or of an option's value tells the completion what may stand there: FILE,
/// COMMAND, or one of those that the hidden command "words" knows.
class Command {
  public:
    Command(CLI::App& app, Action& action, const std::string& name, const std::string& help);

    /// More about it, behind its options.
    Command& details(const std::string& text);
    /// Not listed.
    Command& hidden();

    Command& operand(const char* word, std::string& value, const std::string& help);
    Command& operand(const char* word, std::optional<std::string>& value, const std::string& help);
    /// One or more, or with `least` 0 any number.
    Command& operands(const char* word, std::vector<std::string>& values, const std::string& help,
                      int least = 1);
    /// One of some words; the operand is called by all of them.
    Command& choice(std::string& value, const std::vector<std::string>& words,
                    const std::string& help);
    /// A number; an operand, or an option when the name begins with a dash.
    template <typename Number>
    Command& number(const char* name, Number& value, const std::string& help,
                    tools::NumberRange range = {std::numeric_limits<Number>::min(),
                                                std::numeric_limits<Number>::max()}) {
        return addNumber(name, help, range,
                         [&value](int64_t number) { value = static_cast<Number>(number); });
    }

    Command& option(const char* names, const char* word, std::string& value,
                    const std::string& help);
    /// An option that is one of some words.
    Command& choiceOption(const char* names, std::string& value,
                          const std::vector<std::string>& words, const std::string& help);
    /// An option whose value `take` reads; what it returns is wrong with it.
    Command& parsed(const char* names, const char* word, const std::string& help,
                    std::function<std::string(const std::string& text)> take);
    Command& decimal(const char* names, const char* word, double& value, const std::string& help,
                     tools::DecimalRange range);
    Command& flag(const char* names, bool& value, const std::string& help);
    /// An option that has to be there.
    Command& required(const char* name);
    /// Two options that do not go together.
    Command& excludes(const char* one, const char* other);

    /// Looks at the whole command line; what is returned is wrong with it.
    Command& check(std::function<std::string()> problem);

    void runs(Action run);

  private:
    Command& addNumber(const char* name, const std::string& help, tools::NumberRange range,
                       std::function<void(int64_t)> store);

    CLI::App* const mApp;
    Action& mAction;
    std::function<std::string()> mCheck;
};

/// The options that zelkctl itself and all commands have; they fill in the settings.
void addCommonOptions(CLI::App& app);

/// A word in front of other commands, which are added to what is returned.
CLI::App& addGroup(CLI::App& app, const char* name, const char* help);

}  // namespace pemaro::zelkctl
