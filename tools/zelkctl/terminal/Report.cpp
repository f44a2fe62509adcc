// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/terminal/Report.h"

#include "tools/common/Printable.h"
#include "tools/common/StandardOutput.h"
#include "tools/zelkctl/terminal/Json.h"
#include "tools/zelkctl/terminal/Settings.h"
#include "tools/zelkctl/terminal/Supervisor.h"

namespace pemaro::zelkctl {

int fail(const std::string& problem, int exitStatus) {
    hideCall();
    tools::writeError(settings().json
                              ? JsonObject().add("error", problem).add("exit", exitStatus).text()
                              : "zelkctl: " + problem);
    return exitStatus;
}

int failUsage(const std::string& problem) {
    const std::string text = tools::printable(problem);
    return fail(settings().json ? text : text + " (--help tells more)", tools::kExitUsage);
}

int failAbsent(const std::string& service) {
    return fail(fmt::format("the service {} is not running", service), tools::kExitAbsent);
}

int failStatus(const std::string& operation, int status, const std::string& about) {
    const std::string problem = fmt::format("{}: {} ({}){}", operation, errStr(status),
                                            statusCode(status), about.empty() ? "" : ": " + about);
    if (!settings().json) {
        return fail(problem);
    }
    JsonObject object;
    object.add("error", problem)
            .add("operation", operation)
            .add("status", status)
            .add("code", statusCode(status))
            .add("message", std::string(errStr(status)));
    if (!about.empty()) {
        object.add("about", about);
    }
    tools::writeError(object.add("exit", tools::kExitFailure).text());
    return tools::kExitFailure;
}

std::string statusCode(int status) {
    return fmt::format("0x{:08X}", static_cast<unsigned int>(status));
}

}  // namespace pemaro::zelkctl
