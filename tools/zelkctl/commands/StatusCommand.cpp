// SPDX-License-Identifier: Apache-2.0
#include <memory>
#include <optional>
#include <string>

#include "tools/zelkctl/commands/Commands.h"
#include "tools/zelkctl/terminal/Output.h"
#include "tools/zelkctl/terminal/Report.h"

namespace pemaro::zelkctl {
namespace {

void sayStatus(int status) {
    sayResult(fmt::format("{}  {:10}  {}", statusCode(status), status, errStr(status)),
              JsonObject()
                      .add("status", status)
                      .add("code", statusCode(status))
                      .add("message", std::string(errStr(status))));
}

bool isKnown(int status) {
    return status == STATUS_NO_ERROR ||
           (status >= STATUS_UNKNOWN_ERROR && status <= STATUS_CORRUPT_DATA);
}

int explain(const std::optional<std::string>& number) {
    if (!number) {
        sayStatus(STATUS_NO_ERROR);
        for (int status = STATUS_UNKNOWN_ERROR; status <= STATUS_CORRUPT_DATA; ++status) {
            sayStatus(status);
        }
        return tools::kExitSuccess;
    }
    const auto status = static_cast<int>(*tools::parseNumber(*number, tools::kAny32));
    if (!isKnown(status)) {
        return fail(fmt::format("{} is no status of the touch stack", statusCode(status)));
    }
    sayStatus(status);
    return tools::kExitSuccess;
}

}  // namespace

void addStatusCommand(CLI::App& app, Action& action) {
    auto number = std::make_shared<std::optional<std::string>>();
    Command(app, action, "status", "Explain a status, or all that there are")
            .operand("NUMBER", *number, "The status, such as 0x4000000B")
            .check([number] {
                const std::string problem =
                        *number ? tools::numberProblem(**number, tools::kAny32) : "";
                return problem.empty() ? "" : "NUMBER: " + problem;
            })
            .runs([number] { return explain(*number); });
}

}  // namespace pemaro::zelkctl
