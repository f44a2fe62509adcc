// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/commands/CheckCommand.h"

#include <binder/IServiceManager.h>

#include <algorithm>
#include <memory>
#include <string>
#include <vector>

#include "tools/common/NearestWord.h"
#include "tools/zelkctl/conformance/Conformance.h"
#include "tools/zelkctl/services/ServiceWatch.h"
#include "tools/zelkctl/terminal/Output.h"
#include "tools/zelkctl/terminal/Report.h"
#include "tools/zelkctl/terminal/Settings.h"
#include "tools/zelkctl/terminal/Supervisor.h"

using android::IBinder;
using android::sp;

namespace pemaro::zelkctl {
namespace {

struct CheckOptions {
    std::vector<std::string> services;
    bool invasive = false;
    bool tap = false;

    Findings::Style style() const {
        return settings().json ? Findings::Style::kJson
               : tap           ? Findings::Style::kTap
                               : Findings::Style::kText;
    }
    bool asksFor(const CheckedInterface& interface) const {
        return services.empty() ||
               std::find(services.begin(), services.end(), interface.word) != services.end();
    }
};

/// What is wrong with the words for services; empty when nothing is.
std::string problemOf(const std::vector<std::string>& services) {
    const std::vector<std::string> known = checkedWords();
    for (const std::string& service : services) {
        if (std::find(known.begin(), known.end(), service) == known.end()) {
            return fmt::format("SERVICE: there is no '{}'{}", service,
                               tools::nearestWordHint(service, known));
        }
    }
    return "";
}

int check(const CheckOptions& options) {
    const int exitStatus = startBinder();
    if (exitStatus != tools::kExitSuccess) {
        return exitStatus;
    }
    const auto manager = android::defaultServiceManager();
    std::vector<std::pair<const CheckedInterface*, sp<IBinder>>> found;
    for (const CheckedInterface& interface : checkedInterfaces()) {
        if (!options.asksFor(interface)) {
            continue;
        }
        if (mustStop()) {
            return failStopped();
        }
        const sp<IBinder> binder = manager->checkService(android::String16(interface.descriptor));
        if (binder != nullptr) {
            found.emplace_back(&interface, binder);
        } else if (!options.services.empty()) {
            return failAbsent(interface.descriptor);
        }
    }
    if (found.empty()) {
        return fail("none of the services is running", tools::kExitAbsent);
    }
    Findings findings(options.style(), say);
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
    Command(app, action, "check", "Find out whether the services that run are good ones")
            .operands("SERVICE", options->services,
                      "companion, touch, gesture or hand (all that run)", 0)
            .flag("--invasive", options->invasive,
                  "Record frames as well, and check operations that may change the service's state")
            .flag("--tap", options->tap, "Print in the Test Anything Protocol")
            .details(
                    "Looked at is whether a service keeps to what clients rely on. Each check has "
                    "passed, failed, or was skipped for a reason; the exit status is 1 when one "
                    "failed.")
            .check([options]() -> std::string {
                return options->tap && settings().json ? "--tap excludes --json"
                                                       : problemOf(options->services);
            })
            .runs([options] { return check(*options); });
}

}  // namespace pemaro::zelkctl
