// SPDX-License-Identifier: Apache-2.0
#include "tests/support/LogLines.h"

#include <cstdio>

#include "pemaro/testkit/LogRecorder.h"

namespace pemaro::test {

namespace {

// In the order of android_LogPriority:
// unknown, default, verbose, debug, info, warn, error, fatal, silent.
constexpr char kLetters[] = "??VDIWEFS";

char letterOf(int priority) {
    const int count = sizeof(kLetters) - 1;
    return priority >= 0 && priority < count ? kLetters[priority] : '?';
}

}  // namespace

Lines linesOf(const std::string& tag) {
    Lines result;
    for (const LogLine& line : LogRecorder::instance().lines()) {
        if (line.tag == tag) {
            result.push_back(std::string(1, letterOf(line.priority)) + " " + line.text);
        }
    }
    return result;
}

std::string withAddress(const char* format, const void* address) {
    char line[256];
    snprintf(line, sizeof(line), format, address);
    return line;
}

void clearLog() {
    LogRecorder::instance().clear();
}

}  // namespace pemaro::test
