// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/commands/Watch.h"

#include <CLI/CLI.hpp>
#include <algorithm>
#include <chrono>
#include <memory>

#include "frames/FrameFile.h"
#include "tools/zelkctl/commands/Lasting.h"
#include "tools/zelkctl/services/ServiceWatch.h"
#include "tools/zelkctl/terminal/Report.h"
#include "tools/zelkctl/terminal/StopSignal.h"

namespace pemaro::zelkctl {
namespace {

using Clock = std::chrono::steady_clock;
using std::chrono::milliseconds;

constexpr uint64_t kMaxEvents = 1000000000000;

std::string noSuch(const char* what, const std::string& text, const std::string& words) {
    return fmt::format("there is no {} '{}'; there are {}", what, text, words);
}

/// The watching of one client, from its first connection to its end.
class Watcher {
  public:
    Watcher(const WatchOptions& options, const Watched& watched, EventReceiver& receiver)
            : mWatched(watched),
              mReceiver(receiver),
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
            return mStopSignal.caught() ? tools::kExitSuccess : failAbsent(mWatched.service);
        }
        int status = mWatched.init();
        if (status != STATUS_NO_ERROR) {
            return failStatus("init", status);
        }
        if (mWatched.begin && (status = mWatched.begin()) != STATUS_NO_ERROR) {
            failStatus(mWatched.beginName, status);
        }
        while (status == STATUS_NO_ERROR && !isOver(kWatchPeriod)) {
            if (mService->died()) {
                status = reconnect();
            }
        }
        mWatched.deinit();
        return status == STATUS_NO_ERROR ? tools::kExitSuccess : tools::kExitFailure;
    }

  private:
    /// Waits for so long to see whether the watch is to end.
    bool isOver(milliseconds patience) {
        const auto left = std::max(Clock::duration(0), mDeadline - Clock::now());
        if (left < patience) {
            patience = std::chrono::ceil<milliseconds>(left);
        }
        return mReceiver.waitUntilDone(patience) || mStopSignal.caught() ||
               Clock::now() >= mDeadline;
    }

    int reconnect() {
        mReceiver.tellOfService("died");
        mWatched.deinit();
        int status = STATUS_NO_ERROR;
        do {
            mService = ServiceWatch::await(mWatched.service, std::nullopt,
                                           [this] { return isOver(milliseconds(0)); });
            if (mService == nullptr) {
                return STATUS_NO_ERROR;
            }
            status = mWatched.init();
        } while (status != STATUS_NO_ERROR && mService->died());
        if (status != STATUS_NO_ERROR) {
            failStatus("init", status);
            return status;
        }
        mReceiver.tellOfService("is back");
        return STATUS_NO_ERROR;
    }

    const StopSignal mStopSignal;
    const Watched& mWatched;
    EventReceiver& mReceiver;
    const Clock::time_point mDeadline;
    std::unique_ptr<ServiceWatch> mService;
};

}  // namespace

void addWatchOptions(CLI::App& command, WatchOptions& options) {
    command.add_option("-n,--count", options.count, "End after so many events")
            ->check(CLI::Range(uint64_t{1}, kMaxEvents));
    addSecondsOption(command, options.seconds);
    command.add_option("-o,--output", options.output,
                       "File to write the events' records to, one after another");
    command.add_flag("--json", options.json, "Print each event as a line of JSON");
}

void addGestureOptions(CLI::App& command, WatchOptions& options) {
    command.add_option_function<std::string>(
            "--gesture",
            [&options](const std::string& text) {
                options.filter.gesture = gestureOf(text);
                if (!options.filter.gesture) {
                    throw CLI::ValidationError("--gesture",
                                               noSuch("gesture", text, gestureWords()));
                }
            },
            "Only this gesture, a number or a name like swipe-right");
    command.add_flag("--draw", options.draw, "Draw the strokes, or with --json list their points");
}

void addFeatureOption(CLI::App& command, WatchOptions& options) {
    command.add_option("--feature", options.filter.feature, "Only gestures of this feature");
}

void addHandEventOption(CLI::App& command, WatchOptions& options) {
    command.add_option_function<std::string>(
            "--event",
            [&options](const std::string& text) {
                options.filter.event = handEventOf(text);
                if (!options.filter.event) {
                    throw CLI::ValidationError("--event", noSuch("event", text, handEventWords()));
                }
            },
            "Only this event, a number or a name like hand-detected");
}

void addWatchCommand(CLI::App& app, Action& action, const char* name, const char* help,
                     const std::function<void(CLI::App&, WatchOptions&)>& addMore,
                     std::function<int(const WatchOptions&)> run) {
    auto options = std::make_shared<WatchOptions>();
    CLI::App* command = app.add_subcommand(name, help);
    addWatchOptions(*command, *options);
    addMore(*command, *options);
    command->callback([=, &action] { action = [=] { return run(*options); }; });
}

int watch(const WatchOptions& options, const MakeWatched& make) {
    if (!startBinder()) {
        return tools::kExitFailure;
    }
    frames::FrameFile file;
    if (!options.output.empty() && !file.open(options.output)) {
        return fail(file.problem());
    }
    // It lives as long as the process: an event may still be on its way when we leave.
    auto* receiver = new EventReceiver(options.output.empty() ? nullptr : &file, options.count,
                                       options.json);
    receiver->choose(options.filter, options.draw);
    const Watched watched = make(receiver);
    const int result = Watcher(options, watched, *receiver).run();
    const uint64_t taken = receiver->close();
    if (!file.close()) {
        return fail(fmt::format("{} (it holds the records of {} events)", file.problem(), taken));
    }
    return result;
}

}  // namespace pemaro::zelkctl
