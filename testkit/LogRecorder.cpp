// SPDX-License-Identifier: Apache-2.0
#include "pemaro/testkit/LogRecorder.h"

#include <android/log.h>

#include <cstdarg>
#include <cstdio>
#include <cstdlib>
#include <ostream>

namespace pemaro::test {

bool operator==(const LogLine& a, const LogLine& b) {
    return a.priority == b.priority && a.tag == b.tag && a.text == b.text;
}

void PrintTo(const LogLine& line, std::ostream* out) {
    *out << line.priority << '/' << line.tag << ": " << line.text;
}

LogRecorder::LogRecorder() : mEcho(getenv("ZELK_TEST_LOG") != nullptr) {}

LogRecorder& LogRecorder::instance() {
    // Never destroyed: a thread may still log while the program exits.
    static LogRecorder& recorder = *new LogRecorder;
    return recorder;
}

void LogRecorder::clear() {
    const std::lock_guard<std::mutex> lock(mMutex);
    mLines.clear();
}

std::vector<LogLine> LogRecorder::lines() const {
    const std::lock_guard<std::mutex> lock(mMutex);
    return mLines;
}

void LogRecorder::record(LogLine line) {
    if (mEcho) fprintf(stderr, "%d/%s: %s\n", line.priority, line.tag.c_str(), line.text.c_str());
    const std::lock_guard<std::mutex> lock(mMutex);
    mLines.push_back(std::move(line));
}

namespace {

std::string format(const char* text, va_list arguments) {
    va_list again;
    va_copy(again, arguments);
    const int length = vsnprintf(nullptr, 0, text, again);
    va_end(again);
    std::string result(length < 0 ? 0 : static_cast<size_t>(length), '\0');
    vsnprintf(result.data(), result.size() + 1, text, arguments);
    return result;
}

}  // namespace

}  // namespace pemaro::test

using pemaro::test::LogRecorder;

// The platform's entry points; what a program defines itself comes before what a library offers.

extern "C" int __android_log_print(int priority, const char* tag, const char* text, ...) {
    va_list arguments;
    va_start(arguments, text);
    LogRecorder::instance().record(
            {priority, tag == nullptr ? "" : tag, pemaro::test::format(text, arguments)});
    va_end(arguments);
    return 1;
}

extern "C" void __android_log_assert(const char* condition, const char* tag, const char* text,
                                     ...) {
    std::string message;
    if (text != nullptr) {
        va_list arguments;
        va_start(arguments, text);
        message = pemaro::test::format(text, arguments);
        va_end(arguments);
    }
    fprintf(stderr, "%s|%s|%s\n", condition == nullptr ? "" : condition, tag == nullptr ? "" : tag,
            message.c_str());
    abort();
}
