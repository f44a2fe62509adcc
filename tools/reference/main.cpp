// SPDX-License-Identifier: Apache-2.0

/// Makes the completions and the manual page of a program from its command line:
///
///     zelk-reference zelkctl|zelk-touchstack bash|zsh|man TEMPLATE OUTPUT
///
/// A line of the template that is @COMMANDS@, @OPTIONS@, @VALUES@ or @EXIT@ gives way to what it names;
/// @PROGRAM@ within a line is the program's name.

#include <android-base/file.h>
#include <fmt/core.h>

#include <CLI/CLI.hpp>
#include <algorithm>
#include <cerrno>
#include <cstdio>
#include <cstring>
#include <iterator>
#include <optional>
#include <sstream>
#include <string>

#include "simulator/faults/Fault.h"
#include "tools/common/ExitStatus.h"
#include "tools/common/Printable.h"
#include "tools/reference/Parts.h"
#include "tools/touchstack/Options.h"
#include "tools/zelkctl/commands/CommandTree.h"

namespace pemaro::reference {
namespace {

Program readProgram(CLI::App& app) {
    app.set_version_flag("--version", "", "Print the version and exit");
    return {app.get_name(), describe(app), {}};
}

Program readZelkctl() {
    CLI::App app;
    zelkctl::Action action;
    zelkctl::addCommandTree(app, action);
    return readProgram(app);
}

Program readTouchStack() {
    CLI::App app;
    touchstack::CommandLine line;
    touchstack::addOptions(app, line);
    Program program = readProgram(app);
    program.values = {{"FAULT", simulator::Fault::operations()},
                      {"SERVICES", touchstack::serviceWords()}};
    return program;
}

std::optional<Program> read(const std::string& name) {
    for (auto* const readOne : {readZelkctl, readTouchStack}) {
        const Program program = readOne();
        if (program.name == name) {
            return program;
        }
    }
    return std::nullopt;
}

constexpr const char* kUsage =
        "usage: zelk-reference zelkctl|zelk-touchstack bash|zsh|man TEMPLATE OUTPUT";

struct Part {
    const char* kind;
    const char* mark;
    std::string (*make)(const Program&);
};

constexpr Part kParts[] = {
        {"bash", "@COMMANDS@", bashCommands}, {"bash", "@OPTIONS@", bashOptions},
        {"bash", "@VALUES@", shellValues},    {"zsh", "@COMMANDS@", zshCommands},
        {"zsh", "@VALUES@", shellValues},     {"man", "@COMMANDS@", manCommands},
        {"man", "@OPTIONS@", manOptions},     {"man", "@EXIT@", manExit},
};

std::string fill(const std::string& pattern, const std::string& kind, const Program& program) {
    std::istringstream lines(pattern);
    std::string text;
    for (std::string line; std::getline(lines, line);) {
        std::string made = replaceAll(line, "@PROGRAM@", program.name) + "\n";
        for (const Part& part : kParts) {
            if (kind == part.kind && line == part.mark) {
                made = part.make(program);
            }
        }
        text += made;
    }
    return text;
}

bool isKind(const std::string& kind) {
    return std::any_of(std::begin(kParts), std::end(kParts),
                       [&kind](const Part& part) { return kind == part.kind; });
}

int fail(const std::string& problem, int exitStatus = tools::kExitFailure) {
    fmt::print(stderr, "zelk-reference: {}\n", tools::printable(problem));
    return exitStatus;
}

int make(const std::string& name, const std::string& kind, const std::string& pattern,
         const std::string& output) {
    const std::optional<Program> program = read(name);
    if (!program) {
        return fail("there is no program '" + name + "'", tools::kExitUsage);
    }
    if (!isKind(kind)) {
        return fail("there is no kind of reference '" + kind + "'", tools::kExitUsage);
    }
    std::string text;
    if (!android::base::ReadFileToString(pattern, &text, true)) {
        return fail("cannot read " + pattern + ": " + strerror(errno));
    }
    if (!android::base::WriteStringToFile(fill(text, kind, *program), output, true)) {
        return fail("cannot write " + output + ": " + strerror(errno));
    }
    return tools::kExitSuccess;
}

}  // namespace
}  // namespace pemaro::reference

int main(int argc, char** argv) {
    if (argc != 5) {
        return pemaro::reference::fail(pemaro::reference::kUsage, pemaro::tools::kExitUsage);
    }
    return pemaro::reference::make(argv[1], argv[2], argv[3], argv[4]);
}
