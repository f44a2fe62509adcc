// SPDX-License-Identifier: Apache-2.0
#include <CLI/CLI.hpp>
#include <algorithm>
#include <chrono>
#include <memory>

#include "frames/FrameFile.h"
#include "pemaro/ITouchCompanionFacade.h"
#include "tools/zelkctl/commands/Commands.h"
#include "tools/zelkctl/commands/Lasting.h"
#include "tools/zelkctl/services/Connection.h"
#include "tools/zelkctl/services/FrameReceiver.h"
#include "tools/zelkctl/services/FrameStream.h"
#include "tools/zelkctl/terminal/LiveLine.h"
#include "tools/zelkctl/terminal/Report.h"
#include "tools/zelkctl/terminal/StopSignal.h"

namespace pemaro::zelkctl {
namespace {

using Clock = std::chrono::steady_clock;
using Seconds = std::chrono::duration<double>;
using std::chrono::milliseconds;

constexpr uint64_t kMaxFrames = 1000000000000;
constexpr milliseconds kRedrawPeriod(200);
constexpr milliseconds kLinePeriod(1000);

struct RecordOptions {
    uint64_t frames = 0;
    double seconds = 0;
    std::string output;
};

/// Shows the progress of a recording now and then.
class Progress {
  public:
    explicit Progress(Clock::time_point start) : mStart(start), mShownAt(start) {}

    void update(const FrameStats& stats) {
        const Clock::time_point now = Clock::now();
        if (now - mShownAt < (mLine.isTerminal() ? kRedrawPeriod : kLinePeriod)) {
            return;
        }
        const double rate = (stats.frames - mShownFrames) / Seconds(now - mShownAt).count();
        mLine.show(fmt::format("{:7.1f} s  {} frames  {:.1f} frames/s  {} bytes  {}",
                               Seconds(now - mStart).count(), stats.frames, rate, stats.bytes,
                               describeLosses(stats)));
        mShownAt = now;
        mShownFrames = stats.frames;
    }

  private:
    LiveLine mLine;
    const Clock::time_point mStart;
    Clock::time_point mShownAt;
    uint64_t mShownFrames = 0;
};

/// Returns when the recording is to end, for whatever reason; the seconds that it took.
double watch(const RecordOptions& options, const Connection& connection,
             const StopSignal& stopSignal, FrameReceiver& receiver) {
    const Clock::time_point start = Clock::now();
    Progress progress(start);
    while (!stopSignal.caught() && !connection.serviceDied()) {
        milliseconds patience = kWatchPeriod;
        if (options.seconds > 0) {
            const Seconds left(options.seconds - Seconds(Clock::now() - start).count());
            if (left.count() <= 0) {
                break;
            }
            patience = std::min(patience, std::chrono::ceil<milliseconds>(left));
        }
        if (receiver.waitUntilDone(patience)) {
            break;
        }
        progress.update(receiver.stats());
    }
    return Seconds(Clock::now() - start).count();
}

void printSummary(const FrameStats& stats, double seconds) {
    fmt::print("recorded {} frames, {} bytes in {:.1f} s, {:.1f} frames/s, {}, {} corrupt\n",
               stats.frames, stats.bytes, seconds, seconds > 0 ? stats.frames / seconds : 0.0,
               describeLosses(stats), stats.corrupt);
}

/// Stops the service, prints the summary, and judges how it went.
int finish(ITouchCompanionFacade& facade, const Connection& connection, frames::FrameFile& file,
           const FrameReceiver& receiver, double seconds) {
    const int status = facade.stopRecord();
    const FrameStats stats = receiver.stats();
    printSummary(stats, seconds);
    if (!file.close()) {
        return fail(fmt::format("{} (it holds {} whole frames)", file.problem(), stats.frames));
    }
    if (connection.serviceDied()) {
        return fail(fmt::format("the service died after {} frames", stats.frames));
    }
    if (status != STATUS_NO_ERROR) {
        return failStatus("stopRecord", status);
    }
    if (stats.corrupt != 0) {
        return fail(fmt::format("{} corrupt frames; {}", stats.corrupt, stats.firstCorrupt));
    }
    return tools::kExitSuccess;
}

int record(const RecordOptions& options) {
    const StopSignal stopSignal;
    const std::unique_ptr<Connection> connection = Connection::open();
    if (connection == nullptr) {
        return tools::kExitFailure;
    }
    frames::FrameFile file;
    FrameReceiver receiver(options.output.empty() ? nullptr : &file, options.frames);
    const auto facade = Connection::openFacade(&FrameReceiver::onFrame, &receiver);
    if (facade == nullptr) {
        return tools::kExitFailure;
    }
    if (preparePackets(*facade, receiver) != tools::kExitSuccess) {
        return tools::kExitFailure;
    }
    if (!options.output.empty() && !file.open(options.output)) {
        return fail(file.problem());
    }
    if (startStream(*facade) != tools::kExitSuccess) {
        return tools::kExitFailure;
    }
    const double seconds = watch(options, *connection, stopSignal, receiver);
    return finish(*facade, *connection, file, receiver, seconds);
}

}  // namespace

void addRecordCommand(CLI::App& app, Action& action) {
    auto options = std::make_shared<RecordOptions>();
    CLI::App* command = app.add_subcommand("record", "Record touch frames until told to stop");
    command->add_option("-n,--frames", options->frames, "End after so many frames")
            ->check(CLI::Range(uint64_t{1}, kMaxFrames));
    addSecondsOption(*command, options->seconds);
    command->add_option("-o,--output", options->output,
                        "File to write the frames to, one after another");
    command->callback([options, &action] { action = [options] { return record(*options); }; });
}

}  // namespace pemaro::zelkctl
