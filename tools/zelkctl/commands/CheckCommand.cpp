// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/commands/CheckCommand.h"

#include <binder/IServiceManager.h>

#include <CLI/CLI.hpp>
#include <algorithm>
#include <memory>
#include <string>
#include <vector>

#include "tools/zelkctl/conformance/Conformance.h"
#include "tools/zelkctl/services/ServiceWatch.h"
#include "tools/zelkctl/terminal/Report.h"

using android::IBinder;
using android::sp;

namespace pemaro::zelkctl {
namespace {

struct CheckOptions {
    std::vector<std::string> services;
    bool invasive = false;
    bool json = false;
    bool tap = false;

    Findings::Style style() const {
        return json ? Findings::Style::kJson : tap ? Findings::Style::kTap : Findings::Style::kText;
    }
    bool asksFor(const CheckedInterface& interface) const {
        return services.empty() ||
               std::find(services.begin(), services.end(), interface.word) != services.end();
    }
};

void printLine(const std::string& line) {
    fmt::print("{}\n", line);
    fflush(stdout);
}

int check(const CheckOptions& options) {
    if (!startBinder()) {
        return tools::kExitFailure;
    }
    const auto manager = android::defaultServiceManager();
    std::vector<std::pair<const CheckedInterface*, sp<IBinder>>> found;
    for (const CheckedInterface& interface : checkedInterfaces()) {
        if (!options.asksFor(interface)) {
            continue;
        }
        const sp<IBinder> binder = manager->checkService(android::String16(interface.descriptor));
        if (binder != nullptr) {
            found.emplace_back(&interface, binder);
        } else if (!options.services.empty()) {
            return failAbsent(interface.descriptor);
        }
    }
    if (found.empty()) {
        return fail("none of the services is running");
    }
    Findings findings(options.style(), printLine);
    for (const auto& [interface, binder] : found) {
        checkService(binder, *interface, options.invasive,
                     [&findings](const Finding& finding) { findings.add(finding); });
    }
    findings.end();
    return findings.failed() == 0 ? tools::kExitSuccess : tools::kExitFailure;
}

}  // namespace

void addCheckCommand(CLI::App& app, Action& action) {
    auto options = std::make_shared<CheckOptions>();
    CLI::App* command =
            app.add_subcommand("check", "Find out whether the services that run are good ones");
    std::vector<std::string> words;
    for (const CheckedInterface& interface : checkedInterfaces()) {
        words.emplace_back(interface.word);
    }
    command->add_option("SERVICE", options->services,
                        "companion, touch, gesture or hand (all that run)")
            ->check(CLI::IsMember(words));
    command->add_flag("--invasive", options->invasive,
                      "Check operations as well that may change the service's state");
    CLI::Option* json = command->add_flag("--json", options->json, "Print a line of JSON for each");
    command->add_flag("--tap", options->tap, "Print in the Test Anything Protocol")->excludes(json);
    command->callback([options, &action] { action = [options] { return check(*options); }; });
}

}  // namespace pemaro::zelkctl
