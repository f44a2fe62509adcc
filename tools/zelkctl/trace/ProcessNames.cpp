// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/trace/ProcessNames.h"

#include <android-base/file.h>
#include <fmt/core.h>

#include <cstdio>

#include "tools/zelkctl/terminal/Printable.h"

namespace pemaro::zelkctl {

Party ProcessNames::party(int process, int thread) {
    Party party{process == 0 && thread != 0 ? processOf(thread) : process, thread, ""};
    // A number may be another process's by now: the last name that was seen is taken for one that ended.
    std::string& name = mNames[party.process];
    const std::string now = party.process == 0 ? "" : nameOf(party.process);
    if (!now.empty()) {
        name = now;
    } else if (name.empty() && thread != 0) {
        name = mRemember(thread);
    }
    party.name = printable(name.empty() ? "?" : name);
    if (party.process == 0) {
        mNames.erase(0);
    }
    return party;
}

/// The program as it was called, without its folder.
std::string ProcessNames::nameOf(int process) const {
    std::string words;
    android::base::ReadFileToString(fmt::format("{}/{}/cmdline", mProc, process), &words);
    const std::string program = words.substr(0, words.find('\0'));
    return program.substr(program.rfind('/') + 1);
}

int ProcessNames::processOf(int thread) const {
    std::string status;
    android::base::ReadFileToString(fmt::format("{}/{}/status", mProc, thread), &status);
    const size_t line = status.find("\nTgid:");
    int process = 0;
    return line != std::string::npos && sscanf(&status[line], "\nTgid: %d", &process) == 1 ? process
                                                                                           : 0;
}

}  // namespace pemaro::zelkctl
