// SPDX-License-Identifier: Apache-2.0
#include "tools/common/CommandLine.h"

#include <android/log.h>
#include <unistd.h>

#include <CLI/CLI.hpp>
#include <cstdio>

#include "pemaro/Version.h"

namespace pemaro::tools {

std::optional<int> parseCommandLine(CLI::App& app, int argc, char** argv,
                                    const std::function<void()>& check) {
    app.failure_message([](const CLI::App* failed, const CLI::Error& error) {
        return failed->get_name() + ": " + error.what() + " (--help tells more)\n";
    });
    app.set_version_flag("--version", app.get_name() + " " ZELK_VERSION,
                         "Print the version and exit");
    try {
        app.parse(argc, argv);
        if (check) {
            check();
        }
    } catch (const CLI::ParseError& error) {
        return app.exit(error) == 0 ? kExitSuccess : kExitUsage;
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
