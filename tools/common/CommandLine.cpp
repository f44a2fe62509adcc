// SPDX-License-Identifier: Apache-2.0
#include "tools/common/CommandLine.h"

#include <android/log.h>
#include <fmt/core.h>
#include <unistd.h>

#include <CLI/CLI.hpp>
#include <cstdio>
#include <sstream>
#include <vector>

#include "pemaro/Version.h"
#include "tools/common/NearestWord.h"
#include "tools/common/Printable.h"
#include "tools/common/StandardOutput.h"

namespace pemaro::tools {
namespace {

/// Stands in front of what is a value or an operand, as it is handed to the parser: the parser has a
/// syntax of its own for some words, as "[a,b]", "++" and the names of commands, and sees none of
/// them then.
constexpr char kMark = '\1';

std::string unmarked(const std::string& word) {
    return !word.empty() && word[0] == kMark ? word.substr(1) : word;
}

/// Follows the words of a command line through the tree of commands, for what the parser tells too
/// late, in another order, or without a hint, and for what it would take for something else.
class Walk {
  public:
    explicit Walk(CLI::App& app) : mCommand(&app) {}

    /// The first thing that is wrong; empty when nothing is.
    std::string problem(const std::vector<std::string>& words) {
        for (size_t i = 0; i < words.size(); ++i) {
            const std::string& word = words[i];
            std::string wrong;
            if (!mOperandsOnly && word == "--") {
                mOperandsOnly = true;
            } else if (!mOperandsOnly && isOption(word)) {
                wrong = takeOption(words, i);
            } else if (!mCommand->get_subcommands({}).empty()) {
                wrong = takeCommand(word);
            } else {
                wrong = takeOperand(word);
            }
            if (!wrong.empty()) {
                return wrong;
            }
        }
        return "";
    }

    /// The words as the parser takes them: an option and its value apart, and no "--".
    const std::vector<std::string>& words() const { return mWords; }

    /// Makes the options and operands of the commands that were named take what was typed.
    void prepareOptions() const {
        for (CLI::App* app = mCommand; app != nullptr; app = app->get_parent()) {
            for (CLI::Option* option : app->get_options()) {
                if (option->get_expected_max() != 0) {
                    option->transform(unmarked, "");
                }
            }
        }
    }

  private:
    static bool isOption(const std::string& word) {
        const bool isNumber = word.size() > 1 && (isdigit(word[1]) != 0 || word[1] == '.');
        return word.size() > 1 && word[0] == '-' && !isNumber;
    }

    std::vector<std::string> commandNames() const {
        std::vector<std::string> names;
        for (const CLI::App* command : mCommand->get_subcommands({})) {
            // What the help does not list is no hint either.
            if (!command->get_group().empty()) {
                names.push_back(command->get_name());
            }
        }
        return names;
    }

    std::string takeCommand(const std::string& word) {
        for (CLI::App* command : mCommand->get_subcommands({})) {
            if (command->get_name() == word) {
                mCommand = command;
                mWords.push_back(word);
                return "";
            }
        }
        return unknown("command", word, commandNames());
    }

    std::string takeOption(const std::vector<std::string>& words, size_t& i) {
        const std::string& word = words[i];
        const bool isLong = word[1] == '-';
        const size_t end = isLong ? word.find('=') : 2;
        const std::string name = word.substr(0, end);
        const CLI::Option* option = mCommand->get_option_no_throw(name);
        if (option == nullptr || !option->nonpositional()) {
            return unknown("option", name, optionNames());
        }
        const bool isAttached = end != std::string::npos && end < word.size();
        mWords.push_back(name);
        if (option->get_expected_max() == 0) {
            return isAttached ? name + ": it takes no value" : "";
        }
        if (!isAttached && (i + 1 == words.size() || isOption(words[i + 1]))) {
            return name + ": a value is missing";
        }
        const std::string value = isAttached ? word.substr(isLong ? end + 1 : end) : words[++i];
        mWords.push_back(kMark + value);
        return value.empty() ? name + ": the value is empty" : "";
    }

    std::string takeOperand(const std::string& word) {
        size_t most = 0;
        const CLI::Option* current = nullptr;
        for (const CLI::Option* operand : mCommand->get_options(
                     [](const CLI::Option* option) { return option->get_positional(); })) {
            most += static_cast<size_t>(operand->get_items_expected_max());
            if (current == nullptr && mOperands < most) {
                current = operand;
            }
        }
        if (current == nullptr) {
            return fmt::format("the argument '{}' is one too many", word);
        }
        mOperands += 1;
        mWords.push_back(kMark + word);
        return word.empty() ? current->get_name(true) + ": the argument is empty" : "";
    }

    std::vector<std::string> optionNames() const {
        std::vector<std::string> names;
        for (const CLI::Option* option : mCommand->get_options()) {
            for (const std::string& name : option->get_lnames()) {
                names.push_back("--" + name);
            }
            for (const std::string& name : option->get_snames()) {
                names.push_back("-" + name);
            }
        }
        return names;
    }

    static std::string unknown(const char* kind, const std::string& word,
                               const std::vector<std::string>& known) {
        return fmt::format("there is no {} '{}'{}", kind, word, nearestWordHint(word, known));
    }

    CLI::App* mCommand;
    std::vector<std::string> mWords;
    size_t mOperands = 0;
    bool mOperandsOnly = false;
};

/// Whoever asks for the version behind a command is answered as well; the help lists it once.
void addVersionBehind(CLI::App& app, const std::string& version) {
    for (CLI::App* command : app.get_subcommands({})) {
        command->set_version_flag("--version", version)->group("");
        addVersionBehind(*command, version);
    }
}

}  // namespace

std::optional<int> parseCommandLine(CLI::App& app, int argc, char** argv,
                                    const std::function<void()>& check, const UsageReport& report) {
    const auto refuse = [&](const std::string& problem) {
        if (report) {
            report(problem);
        } else {
            writeError(app.get_name() + ": " + printable(problem) + " (--help tells more)");
        }
        return kExitUsage;
    };
    app.set_version_flag("--version", app.get_name() + " " ZELK_VERSION,
                         "Print the version and exit");
    addVersionBehind(app, app.get_name() + " " ZELK_VERSION);
    Walk walk(app);
    const std::string problem = walk.problem({argv + 1, argv + argc});
    if (!problem.empty()) {
        return refuse(problem);
    }
    walk.prepareOptions();
    try {
        // The parser takes them from the end.
        app.parse(std::vector<std::string>(walk.words().rbegin(), walk.words().rend()));
        if (check) {
            check();
        }
    } catch (const CLI::Success& success) {
        std::ostringstream text;
        app.exit(success, text, text);
        writeOutput(text.str());
        const std::string failure = outputProblem();
        if (!failure.empty()) {
            writeError(app.get_name() + ": " + failure);
        }
        return failure.empty() ? kExitSuccess : kExitFailure;
    } catch (const CLI::ParseError& error) {
        return refuse(error.what());
    }
    return std::nullopt;
}

void showPlatformLog(bool show) {
    __android_log_set_minimum_priority(show ? ANDROID_LOG_VERBOSE : ANDROID_LOG_FATAL);
}

void leave(int status) {
    fflush(stdout);
    fflush(stderr);
    _exit(status);
}

}  // namespace pemaro::tools
