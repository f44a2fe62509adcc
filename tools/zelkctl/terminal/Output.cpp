// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/terminal/Output.h"

#include <unistd.h>

#include <atomic>

#include "frames/OwnDescriptor.h"
#include "tools/common/StandardOutput.h"
#include "tools/zelkctl/terminal/Settings.h"
#include "tools/zelkctl/terminal/Supervisor.h"

namespace pemaro::zelkctl {
namespace {

std::atomic<bool> gDataOnOutput{false};

}  // namespace

bool isStandardOutput(const std::string& path) {
    return path == kStandardOutput || frames::ownDescriptor(path) == STDOUT_FILENO;
}

void giveOutputToData() {
    gDataOnOutput = true;
}

int wordsDescriptor() {
    return gDataOnOutput ? STDERR_FILENO : STDOUT_FILENO;
}

void say(const std::string& line) {
    hideCall();
    if (gDataOnOutput) {
        tools::writeError(line);
    } else {
        tools::writeOutput(line + "\n");
    }
}

void sayResult(const std::string& text, JsonObject& object) {
    say(settings().json ? object.text() : text);
}

void note(const std::string& text) {
    hideCall();
    tools::writeError(settings().json ? JsonObject().add("note", text).text() : "zelkctl: " + text);
}

}  // namespace pemaro::zelkctl
