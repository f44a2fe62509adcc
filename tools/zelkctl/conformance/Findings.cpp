// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/conformance/Findings.h"

#include <fmt/core.h>

#include <utility>

#include "tools/zelkctl/terminal/Json.h"

namespace pemaro::zelkctl {
namespace {

const char* word(Outcome outcome) {
    switch (outcome) {
        case Outcome::kPassed:
            return "passed";
        case Outcome::kFailed:
            return "failed";
        case Outcome::kSkipped:
            break;
    }
    return "skipped";
}

}  // namespace

Findings::Findings(Style style, std::function<void(const std::string&)> print)
        : mStyle(style), mPrint(std::move(print)) {
    if (mStyle == Style::kTap) {
        mPrint("TAP version 13");
    }
}

void Findings::add(const Finding& finding) {
    mCounts[static_cast<int>(finding.outcome)] += 1;
    switch (mStyle) {
        case Style::kText:
            printText(finding);
            break;
        case Style::kJson:
            printJson(finding);
            break;
        case Style::kTap:
            printTap(finding);
            break;
    }
    mService = finding.service;
}

void Findings::end() {
    if (mStyle == Style::kTap) {
        mPrint(fmt::format("1..{}", all()));
    } else if (mStyle == Style::kJson) {
        mPrint(JsonObject()
                       .add("passed", count(Outcome::kPassed))
                       .add("failed", count(Outcome::kFailed))
                       .add("skipped", count(Outcome::kSkipped))
                       .text());
    } else {
        mPrint(fmt::format("{} passed, {} failed, {} skipped", count(Outcome::kPassed),
                           count(Outcome::kFailed), count(Outcome::kSkipped)));
    }
}

void Findings::printText(const Finding& finding) {
    if (finding.service != mService) {
        mPrint(finding.service);
    }
    const std::string shown =
            finding.outcome == Outcome::kFailed ? "FAILED" : word(finding.outcome);
    mPrint(fmt::format("  {:<8} {}{}", shown, finding.check,
                       finding.detail.empty() ? "" : ": " + finding.detail));
}

void Findings::printJson(const Finding& finding) {
    JsonObject object;
    object.add("service", finding.service).add("check", finding.check);
    object.add("outcome", word(finding.outcome));
    if (!finding.detail.empty()) {
        object.add("detail", finding.detail);
    }
    mPrint(object.text());
}

void Findings::printTap(const Finding& finding) {
    const bool failed = finding.outcome == Outcome::kFailed;
    const std::string skip =
            finding.outcome == Outcome::kSkipped ? " # SKIP " + finding.detail : "";
    mPrint(fmt::format("{} {} - {}: {}{}", failed ? "not ok" : "ok", all(), finding.service,
                       finding.check, skip));
    if (failed) {
        // JSON's strings are YAML's as well.
        const std::string object = JsonObject().add("message", finding.detail).text();
        mPrint("  ---");
        mPrint("  message: " + object.substr(11, object.size() - 12));
        mPrint("  ...");
    }
}

}  // namespace pemaro::zelkctl
