// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/commands/CommonOptions.h"

#include <CLI/CLI.hpp>

#include "tools/common/Number.h"
#include "tools/zelkctl/terminal/Settings.h"

namespace pemaro::zelkctl {
namespace {

constexpr tools::DecimalRange kTimeouts{0.001, 1e6};

}  // namespace

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

}  // namespace pemaro::zelkctl
