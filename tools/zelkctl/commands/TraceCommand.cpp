// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/commands/TraceCommand.h"

#include "pemaro/Binder.h"

#include <binder/IServiceManager.h>
#include <binder/Parcel.h>
#include <unistd.h>
#include <utils/Timers.h>

#include <algorithm>
#include <chrono>
#include <memory>
#include <optional>
#include <string>
#include <thread>
#include <vector>

#include "frames/FrameFile.h"
#include "tools/zelkctl/commands/Lasting.h"
#include "tools/zelkctl/services/ServiceWatch.h"
#include "tools/zelkctl/terminal/Output.h"
#include "tools/zelkctl/terminal/Printable.h"
#include "tools/zelkctl/terminal/Report.h"
#include "tools/zelkctl/terminal/Screen.h"
#include "tools/zelkctl/terminal/Settings.h"
#include "tools/zelkctl/terminal/Supervisor.h"
#include "tools/zelkctl/terminal/TerminalTraits.h"
#include "tools/zelkctl/trace/CallSummary.h"
#include "tools/zelkctl/trace/CallText.h"
#include "tools/zelkctl/trace/ProcessNames.h"
#include "tools/zelkctl/trace/Timeline.h"
#include "tools/zelkctl/trace/Tracing.h"
#include "tools/zelkctl/trace/TransactionTracker.h"

namespace pemaro::zelkctl {
namespace {

using Clock = std::chrono::steady_clock;
using Seconds = std::chrono::duration<double>;
using std::chrono::milliseconds;
using std::chrono::nanoseconds;

constexpr int64_t kMaxCalls = 1000000000000;
/// How often a terminal is drawn on, and how often it is looked whether events were lost.
constexpr milliseconds kDrawPeriod(250);

struct TraceOptions {
    std::vector<std::string> services;
    uint64_t count = 0;
    double seconds = 0;
    std::string output;
    bool summary = false;

    bool asksFor(const KnownInterface& interface) const {
        return services.empty() ||
               std::find(services.begin(), services.end(), interface.word) != services.end();
    }
};

int64_t now() {
    return systemTime(SYSTEM_TIME_MONOTONIC);
}

/// How many bytes the request of a callback has: the same for all, and other than any other's.
uint64_t callbackBytes(const KnownInterface& callback) {
    android::Parcel request;
    request.writeInterfaceToken(android::String16(callback.descriptor));
    return request.dataSize() + callback.recordBytes;
}

/// A trace from its first event to its last.
class Trace {
  public:
    Trace(const TraceOptions& options, Tracing& tracing, frames::FrameFile* file)
            : mOptions(options),
              mTracing(tracing),
              mFile(file),
              mTracker([this](const TracedCall& call) { take(call); }),
              mNames(&Tracing::nameOfThread),
              mDraws(!settings().json && wordsDescriptor() == STDOUT_FILENO &&
                     terminalTraits().isTerminal) {
        for (const KnownInterface* callback : knownCallbacks()) {
            mTracker.recognise(callbackBytes(*callback), *callback);
        }
    }

    int run() {
        tellOfAbsent(lookUp());
        watch();
        close();
        tellOfLosses();
        if (mFile != nullptr && !finishFile()) {
            return fail(mFile->problem());
        }
        if (!settings().json || mOptions.summary) {
            sum();
        }
        return tools::kExitSuccess;
    }

  private:
    /// Asks the service manager for the services, which tells the tracker what their objects are;
    /// those that are not there.
    std::vector<std::string> lookUp() {
        const auto manager = android::defaultServiceManager();
        std::vector<std::string> absent;
        for (const KnownInterface* service : knownServices()) {
            if (!mOptions.asksFor(*service) || mustStop()) {
                continue;
            }
            const int64_t from = now();
            const auto binder = call("checkService", [&] {
                return manager->checkService(android::String16(service->descriptor));
            });
            mTracker.addLookup(*service, gettid(), from, now());
            if (binder == nullptr) {
                absent.emplace_back(service->descriptor);
            }
        }
        return absent;
    }

    static void tellOfAbsent(const std::vector<std::string>& absent) {
        if (!absent.empty()) {
            note("not running yet, and shown as soon as it is: " + joined(absent));
        }
    }

    /// Returns when the trace is to end, for whatever reason.
    void watch() {
        std::optional<Screen> screen;
        if (mDraws) {
            screen.emplace();
        }
        Clock::time_point due = mStart;
        while (!isOver()) {
            std::this_thread::sleep_for(std::min<Clock::duration>(kWatchPeriod, left()));
            takeEvents();
            if (mTracker.takeRegistration()) {
                lookUp();
            }
            if (Clock::now() >= due) {
                due = Clock::now() + kDrawPeriod;
                countLosses();
                if (screen && !screen->draw(screenLines())) {
                    return;
                }
            }
        }
    }

    /// Reads what happened until now, and removes the tracing, which takes the kernel a moment.
    void close() {
        const int64_t until = now();
        {
            const Finishing finishing;
            mTracing.read(&mEvents);
            mLost = mTracing.lost();
            mTracing.remove();
        }
        takeEventsUntil(until);
        mTracker.finish();
        writePiece();
    }

    Clock::duration left() const {
        return mOptions.seconds > 0
                       ? std::max(Clock::duration(0), std::chrono::ceil<Clock::duration>(
                                                              Seconds(mOptions.seconds) - passed()))
                       : Clock::duration::max();
    }
    Seconds passed() const { return Clock::now() - mStart; }

    bool isOver() const {
        return mIsFull || mustStop() || left() == Clock::duration(0) ||
               (mFile != nullptr && !mFile->problem().empty());
    }

    /// What happened before the events are read has been read with them, of all processors. What came
    /// meanwhile waits for what may have come before it.
    void takeEvents() {
        const int64_t until = now();
        {
            const Finishing finishing;
            mTracing.read(&mEvents);
        }
        takeEventsUntil(until);
    }

    void takeEventsUntil(int64_t until) {
        std::stable_sort(mEvents.begin(), mEvents.end(),
                         [](const BinderEvent& one, const BinderEvent& other) {
                             return one.time < other.time;
                         });
        const auto rest =
                std::find_if(mEvents.begin(), mEvents.end(),
                             [until](const BinderEvent& event) { return event.time > until; });
        std::for_each(mEvents.begin(), rest,
                      [this](const BinderEvent& event) { mTracker.take(event); });
        mEvents.erase(mEvents.begin(), rest);
        mTracker.expire(until);
        writePiece();
    }

    void take(const TracedCall& call) {
        if (mIsFull || !mOptions.asksFor(*call.interface)) {
            return;
        }
        mSummary.add(call);
        const Party caller = mNames.caller(call);
        const Party callee = mNames.callee(call);
        if (!mDraws && !mOptions.summary) {
            const std::chrono::system_clock::time_point when(
                    std::chrono::duration_cast<std::chrono::system_clock::duration>(
                            nanoseconds(call.sent + mSinceEpoch)));
            say((settings().json ? callJson : callLine)(call, when, caller, callee));
        }
        if (mFile != nullptr) {
            mPiece += mTimeline.add(call, caller, callee);
        }
        mIsFull = mSummary.calls() == mOptions.count;
    }

    void countLosses() {
        const uint64_t lost = mTracing.lost();
        if (lost > mLost) {
            // Replies may be among them.
            mTracker.finish();
        }
        mLost = lost;
    }

    void tellOfLosses() const {
        if (mLost > 0) {
            note(fmt::format("{} events were lost, and calls with them", mLost));
        }
    }

    bool writePiece() {
        const bool good =
                mPiece.empty() || mFile == nullptr || mFile->write(mPiece.data(), mPiece.size());
        mPiece.clear();
        return good;
    }

    bool finishFile() {
        mPiece += mTimeline.end();
        return writePiece() && mFile->close();
    }

    std::string title() const {
        return fmt::format("traced {} calls in {:.1f} s, {} failed, {} events lost",
                           mSummary.calls(), passed().count(), mSummary.failed(), mLost);
    }

    std::vector<std::string> screenLines() const {
        const TerminalTraits traits = terminalTraits();
        std::vector<std::string> lines = {title()};
        for (const std::string& line : mSummary.table()) {
            lines.push_back(line);
        }
        lines.resize(std::min(lines.size(), static_cast<size_t>(traits.rows)));
        for (std::string& line : lines) {
            line.resize(std::min(line.size(), static_cast<size_t>(traits.columns)));
        }
        return lines;
    }

    void sum() const {
        if (mDraws || mOptions.summary) {
            for (const std::string& line :
                 settings().json ? mSummary.jsonLines() : mSummary.table()) {
                say(line);
            }
        }
        if (!settings().json) {
            say(title());
        }
    }

    const TraceOptions& mOptions;
    Tracing& mTracing;
    frames::FrameFile* const mFile;
    TransactionTracker mTracker;
    ProcessNames mNames;
    const bool mDraws;
    const Clock::time_point mStart = Clock::now();
    const int64_t mSinceEpoch = systemTime(SYSTEM_TIME_REALTIME) - now();
    std::vector<BinderEvent> mEvents;
    CallSummary mSummary;
    Timeline mTimeline;
    std::string mPiece;
    uint64_t mLost = 0;
    bool mIsFull = false;
};

int trace(const TraceOptions& options) {
    if (isStandardOutput(options.output)) {
        giveOutputToData();
    }
    const int exitStatus = startBinder();
    if (exitStatus != tools::kExitSuccess) {
        return exitStatus;
    }
    std::string problem = tracingProblem();
    if (!problem.empty()) {
        return fail(problem, tools::kExitAbsent);
    }
    frames::FrameFile file;
    if (!options.output.empty()) {
        const Waiting waiting("while waiting for a reader of " + options.output);
        if (!file.open(options.output, mustStop)) {
            return mustStop() ? failStopped() : fail(file.problem());
        }
    }
    std::unique_ptr<Tracing> tracing;
    {
        const Finishing finishing;
        tracing = Tracing::start(&problem);
    }
    if (tracing == nullptr) {
        return fail(problem, tools::kExitAbsent);
    }
    const LastWords lastWords([&tracing] { tracing->remove(); });
    return Trace(options, *tracing, options.output.empty() ? nullptr : &file).run();
}

}  // namespace

void addTraceCommand(CLI::App& app, Action& action) {
    auto options = std::make_shared<TraceOptions>();
    Command command(app, action, "trace", "Show who calls the services, and how long it takes");
    command.operands("SERVICE", options->services,
                     "companion, touch, gesture or hand (all of them)", 0)
            .number("-n,--count", options->count, "End after so many calls", {1, kMaxCalls});
    addSecondsOption(command, options->seconds);
    command.option("-o,--output", "FILE", options->output,
                   "File to write the calls to for Perfetto's viewer; - is the standard output")
            .flag("--summary", options->summary,
                  "Print no calls, but at the end how many there were of each operation")
            .details(
                    "The calls are taken from the kernel's trace events of the Binder driver, "
                    "which "
                    "takes root's rights. In a terminal the operations are shown with their "
                    "number of calls and how long these took, elsewhere a line for each call.")
            .check([options]() -> std::string {
                for (const std::string& service : options->services) {
                    const auto& known = knownServices();
                    if (std::none_of(known.begin(), known.end(),
                                     [&service](const KnownInterface* interface) {
                                         return interface->word == service;
                                     })) {
                        return fmt::format("SERVICE: there is no '{}'", service);
                    }
                }
                return "";
            })
            .runs([options] { return trace(*options); });
}

}  // namespace pemaro::zelkctl
