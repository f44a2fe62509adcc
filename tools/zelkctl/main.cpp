// SPDX-License-Identifier: Apache-2.0

/// zelkctl: the clients as a command line.

#include <signal.h>

#include <cstring>

#include "tools/common/CommandLine.h"
#include "tools/common/StandardOutput.h"
#include "tools/zelkctl/commands/CommandTree.h"
#include "tools/zelkctl/terminal/Report.h"
#include "tools/zelkctl/terminal/Settings.h"
#include "tools/zelkctl/terminal/Supervisor.h"

using namespace pemaro;

namespace {

/// What is wrong with a command line is told before it is read, and in the form that it asks for.
/// Behind "--" it is an operand.
bool asksForJson(int argc, char** argv) {
    for (int i = 1; i < argc && strcmp(argv[i], "--") != 0; ++i) {
        if (strcmp(argv[i], "--json") == 0) {
            return true;
        }
    }
    return false;
}

}  // namespace

int main(int argc, char** argv) {
    tools::openStandardStreams();
    // A reader of our output that went away is an error of writing, not the end of the command.
    signal(SIGPIPE, SIG_IGN);
    zelkctl::settings().json = asksForJson(argc, argv);
    if (!tools::outputProblem().empty()) {
        tools::leave(zelkctl::fail(tools::outputProblem()));
    }

    zelkctl::Action action;
    if (const auto done = zelkctl::chooseAction(argc, argv, action)) {
        tools::leave(*done);
    }
    tools::showPlatformLog(zelkctl::settings().log);
    tools::leave(zelkctl::supervise(action, zelkctl::settings().timeout));
}
