// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <iosfwd>
#include <mutex>
#include <string>
#include <vector>

namespace pemaro::test {

/// One line of the platform's log, its text formatted.
struct LogLine {
    int priority;
    std::string tag;
    std::string text;
};

bool operator==(const LogLine& a, const LogLine& b);
void PrintTo(const LogLine& line, std::ostream* out);

/// Takes the place of the platform's log in a test program that links it: every line that the
/// library or the platform logs is recorded here instead of being written. With ZELK_TEST_LOG set
/// in the environment, lines go to stderr as well.
///
///     LogRecorder::instance().clear();
///     map.unserialize("{}");
///     EXPECT_THAT(LogRecorder::instance().lines(), ElementsAre(LogLine{6, "SerializableMap", ...
///
/// A fatal assertion writes one line, `condition|tag|text`, to stderr and aborts, which is what a
/// death test can match. All of it may be used from any thread.
class LogRecorder {
  public:
    static LogRecorder& instance();

    void clear();
    std::vector<LogLine> lines() const;

    void record(LogLine line);

  private:
    LogRecorder();

    const bool mEcho;
    mutable std::mutex mMutex;
    std::vector<LogLine> mLines;
};

}  // namespace pemaro::test
