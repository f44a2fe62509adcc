// SPDX-License-Identifier: Apache-2.0
#include "fuzz/support/QuietLog.h"

#include <android/log.h>

#include <cstdarg>
#include <cstdio>
#include <cstdlib>

namespace pemaro::fuzz {

namespace {

std::function<void()> gOnLine;
bool gInHook = false;

}  // namespace

void onLogLine(std::function<void()> hook) {
    gOnLine = std::move(hook);
}

}  // namespace pemaro::fuzz

// The platform's entry points; what a program defines itself comes before what a library offers.

extern "C" int __android_log_print(int /* priority */, const char* /* tag */, const char* text,
                                   ...) {
    // Formatted, so that a sanitizer sees each argument read.
    char line[256];
    va_list arguments;
    va_start(arguments, text);
    vsnprintf(line, sizeof(line), text, arguments);
    va_end(arguments);
    using pemaro::fuzz::gInHook;
    if (pemaro::fuzz::gOnLine && !gInHook) {
        gInHook = true;
        pemaro::fuzz::gOnLine();
        gInHook = false;
    }
    return 1;
}

extern "C" void __android_log_assert(const char* condition, const char* tag, const char* text,
                                     ...) {
    char line[256] = "";
    if (text != nullptr) {
        va_list arguments;
        va_start(arguments, text);
        vsnprintf(line, sizeof(line), text, arguments);
        va_end(arguments);
    }
    fprintf(stderr, "%s|%s|%s\n", condition == nullptr ? "" : condition, tag == nullptr ? "" : tag,
            line);
    abort();
}
