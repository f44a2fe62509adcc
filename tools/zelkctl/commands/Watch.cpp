// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/commands/Watch.h"

#include <algorithm>
#include <chrono>
#include <memory>
#include <utility>

#include "frames/FrameFile.h"
#include "tools/zelkctl/commands/Lasting.h"
#include "tools/zelkctl/services/ServiceWatch.h"
#include "tools/zelkctl/terminal/Output.h"
#include "tools/zelkctl/terminal/Report.h"
#include "tools/zelkctl/terminal/Settings.h"
#include "tools/zelkctl/terminal/Supervisor.h"

namespace pemaro::zelkctl {
namespace {

using Clock = std::chrono::steady_clock;
using std::chrono::milliseconds;

constexpr int64_t kMaxEvents = 1000000000000;

std::string noSuch(const char* what, const std::string& text, const std::string& words) {
    return fmt::format("there is no {} '{}'; there are {}", what, text, words);
}

/// The watching of one client, from its first connection to its end.
class Watcher {
  public:
    Watcher(const WatchOptions& options, const Watched& watched, EventReceiver& receiver)
            : mWatched(watched),
              mReceiver(receiver),
              mIsAwaiting(options.goal.reached.has_value()),
              mDeadline(options.seconds > 0
                                ? Clock::now() +
                                          std::chrono::duration_cast<Clock::duration>(
                                                  std::chrono::duration<double>(options.seconds))
                                : Clock::time_point::max()) {}

    /// The exit status; what failed has been told.
    int run() {
        mService = ServiceWatch::await(mWatched.service, ServiceWatch::kPatience,
                                       [this] { return isOver(milliseconds(0)); });
        if (mService == nullptr) {
            return mustStop() ? tools::kExitSuccess : failAbsent(mWatched.service);
        }
        const LastWords lastWords([] { note("the service was not told that the watch ends"); });
        int status = call("init", mWatched.init);
        if (status != STATUS_NO_ERROR) {
            return failStatus("init", status);
        }
        status = begin();
        while (status == STATUS_NO_ERROR && !isOver(kWatchPeriod) && !isOrphaned()) {
            if (mService->died()) {
                status = reconnect();
            }
        }
        const bool isLost = isOrphaned() && !mReceiver.waitUntilDone(milliseconds(0));
        if (mIsAwaiting) {
            // That it is ended now is no event that was waited for.
            mReceiver.close();
        }
        if (mHasBegun && mWatched.end && !isOrphaned()) {
            // It may have ended by itself, and then the service refuses, which is as well.
            call(mWatched.endName, mWatched.end);
        }
        call("deinit", mWatched.deinit);
        if (isLost) {
            return fail("the service died", tools::kExitAbsent);
        }
        return status == STATUS_NO_ERROR ? tools::kExitSuccess : tools::kExitFailure;
    }

  private:
    int begin() {
        if (mWatched.begin) {
            const int status = call(mWatched.beginName, mWatched.begin);
            mHasBegun = status == STATUS_NO_ERROR;
            if (!mHasBegun) {
                failStatus(mWatched.beginName, status);
                return status;
            }
        }
        tellOfSilence();
        return STATUS_NO_ERROR;
    }

    void tellOfSilence() const {
        const std::string silence = mWatched.silence ? mWatched.silence() : "";
        if (!silence.empty()) {
            note(silence);
        }
    }

    /// What was begun died with its service: another one knows nothing of it.
    bool isOrphaned() const { return mHasBegun && mService->died(); }

    /// Waits for so long to see whether the watch is to end.
    bool isOver(milliseconds patience) {
        const auto left = std::max(Clock::duration(0), mDeadline - Clock::now());
        if (left < patience) {
            patience = std::chrono::ceil<milliseconds>(left);
        }
        return mReceiver.waitUntilDone(patience) || mustStop() || Clock::now() >= mDeadline;
    }

    int reconnect() {
        mReceiver.tellOfService("died");
        call("deinit", mWatched.deinit);
        int status = STATUS_NO_ERROR;
        do {
            mService = ServiceWatch::await(mWatched.service, std::nullopt,
                                           [this] { return isOver(milliseconds(0)); });
            if (mService == nullptr) {
                return STATUS_NO_ERROR;
            }
            status = call("init", mWatched.init);
        } while (status != STATUS_NO_ERROR && mService->died());
        if (status != STATUS_NO_ERROR) {
            failStatus("init", status);
            return status;
        }
        mReceiver.tellOfService("is back");
        // Another service begins with everything switched off.
        tellOfSilence();
        return STATUS_NO_ERROR;
    }

    const Watched& mWatched;
    EventReceiver& mReceiver;
    const bool mIsAwaiting;
    const Clock::time_point mDeadline;
    std::unique_ptr<ServiceWatch> mService;
    bool mHasBegun = false;
};

/// How the wait for an event ended; the exit status.
int judge(const EventGoal& goal, const std::optional<simulator::HandEvent>& event, double seconds) {
    if (event == goal.reached) {
        return tools::kExitSuccess;
    }
    if (event) {
        return fail(simulator::handEventName(*event));
    }
    return mustStop() ? failStopped()
                      : fail(fmt::format("{} has not come within {:g} s",
                                         simulator::handEventName(*goal.reached), seconds),
                             tools::kExitTimeout);
}

}  // namespace

void addWatchOptions(Command& command, WatchOptions& options) {
    command.number("-n,--count", options.count, "End after so many events", {1, kMaxEvents});
    addSecondsOption(command, options.seconds);
    command.option("-o,--output", "FILE", options.output,
                   "File to write the events' records to, one after another; - is the standard "
                   "output");
}

void addGestureOptions(Command& command, WatchOptions& options) {
    command.parsed("--gesture", "GESTURE",
                   "Only this gesture, by its number or its name: " + gestureWords(),
                   [&options](const std::string& text) {
                       options.filter.gesture = gestureOf(text);
                       return options.filter.gesture ? "" : noSuch("gesture", text, gestureWords());
                   })
            .flag("--draw", options.draw, "Draw the strokes, or with --json list their points");
}

void addFeatureOption(Command& command, WatchOptions& options) {
    command.parsed("--feature", "FEATURE", "Only gestures of this feature",
                   [&options](const std::string& text) {
                       const auto number = tools::parseNumber(text, tools::kSigned32);
                       if (number) {
                           options.filter.feature = static_cast<int>(*number);
                       }
                       return tools::numberProblem(text, tools::kSigned32);
                   });
}

void addHandEventOption(Command& command, WatchOptions& options) {
    command.parsed("--event", "EVENT",
                   "Only this event, by its number or its name: " + handEventWords(),
                   [&options](const std::string& text) {
                       options.filter.event = handEventOf(text);
                       return options.filter.event ? "" : noSuch("event", text, handEventWords());
                   });
}

void addWatchCommand(CLI::App& app, Action& action, const char* name, const char* help,
                     const std::function<void(Command&, WatchOptions&)>& addMore,
                     std::function<int(const WatchOptions&)> run) {
    auto options = std::make_shared<WatchOptions>();
    Command command(app, action, name, help);
    addWatchOptions(command, *options);
    addMore(command, *options);
    command.runs([options, run = std::move(run)] { return run(*options); });
}

int watch(const WatchOptions& options, const MakeWatched& make) {
    if (isStandardOutput(options.output)) {
        giveOutputToData();
    }
    int result = startBinder();
    if (result != tools::kExitSuccess) {
        return result;
    }
    frames::FrameFile file;
    if (!options.output.empty()) {
        const Waiting waiting("while waiting for a reader of " + options.output);
        if (!file.open(options.output, mustStop)) {
            return mustStop() ? failStopped() : fail(file.problem());
        }
    }
    // It lives as long as the process: an event may still be on its way when we leave.
    auto* receiver = new EventReceiver(options.output.empty() ? nullptr : &file, options.count,
                                       settings().json);
    receiver->choose(options.filter, options.draw);
    receiver->await(options.goal);
    const Watched watched = make(receiver);
    result = Watcher(options, watched, *receiver).run();
    const uint64_t taken = receiver->close();
    if (result == tools::kExitSuccess && options.goal.reached && file.problem().empty()) {
        result = judge(options.goal, receiver->awaited(), options.seconds);
    }
    // Without an event, and without success, a file stays what it was.
    const bool isWritten = taken > 0 || result == tools::kExitSuccess || !file.problem().empty();
    if (isWritten && !file.close()) {
        return fail(fmt::format("{} (it holds the records of {} events)", file.problem(), taken));
    }
    return result;
}

}  // namespace pemaro::zelkctl
