// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <functional>
#include <string>

namespace pemaro::zelkctl {

enum class Outcome {
    kPassed,
    kFailed,
    kSkipped,  ///< it could not be found out
};

/// What came of one check.
struct Finding {
    std::string service;  ///< its name in the service manager
    std::string check;    ///< what holds of a good service
    Outcome outcome;
    std::string detail;  ///< what was wrong, or why it was skipped
};

/// How findings are printed, and how many there are of each outcome.
class Findings {
  public:
    enum class Style {
        kText,
        kJson,  ///< an object on a line for each, and one for all
        kTap,   ///< the Test Anything Protocol, version 13
    };

    /// `print` gets one line at a time.
    Findings(Style style, std::function<void(const std::string&)> print);

    void add(const Finding& finding);

    /// To be called once, behind the last.
    void end();

    int failed() const { return mCounts[static_cast<int>(Outcome::kFailed)]; }

  private:
    int count(Outcome outcome) const { return mCounts[static_cast<int>(outcome)]; }
    int all() const { return mCounts[0] + mCounts[1] + mCounts[2]; }
    void printText(const Finding& finding);
    void printJson(const Finding& finding);
    void printTap(const Finding& finding);

    const Style mStyle;
    const std::function<void(const std::string&)> mPrint;
    std::string mService;  ///< of the finding before
    int mCounts[3] = {};
};

}  // namespace pemaro::zelkctl
