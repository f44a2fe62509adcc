// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <iosfwd>
#include <mutex>
#include <string>
#include <vector>

namespace pemaro::test {

/// One line of the platform's log, its text formatted.
struct LogLine {
    int priority;      ///< as the platform's: ANDROID_LOG_DEBUG …
    std::string tag;   ///< who logged it
    std::string text;  ///< without a line break at its end
};

/// Equality, and how a failed expectation shows a line.
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
    /// The one of the process.
    static LogRecorder& instance();

    /// Forgets the lines; those since then, in their order.
    void clear();
    std::vector<LogLine> lines() const;

    /// Adds a line, as the platform's log does.
    void record(LogLine line);

  private:
    LogRecorder();

    const bool mEcho;
    mutable std::mutex mMutex;
    std::vector<LogLine> mLines;
};

}  // namespace pemaro::test
