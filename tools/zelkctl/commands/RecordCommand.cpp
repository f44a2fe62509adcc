// SPDX-License-Identifier: Apache-2.0
#include <unistd.h>

#include <algorithm>
#include <chrono>
#include <memory>
#include <string>

#include "frames/FrameFile.h"
#include "pemaro/ITouchCompanionFacade.h"
#include "tools/common/LiveLine.h"
#include "tools/common/StandardOutput.h"
#include "tools/zelkctl/commands/Commands.h"
#include "tools/zelkctl/commands/Lasting.h"
#include "tools/zelkctl/services/Connection.h"
#include "tools/zelkctl/services/FrameReceiver.h"
#include "tools/zelkctl/services/FrameStream.h"
#include "tools/zelkctl/terminal/Output.h"
#include "tools/zelkctl/terminal/Report.h"
#include "tools/zelkctl/terminal/Settings.h"
#include "tools/zelkctl/terminal/Supervisor.h"

namespace pemaro::zelkctl {
namespace {

using Clock = std::chrono::steady_clock;
using Seconds = std::chrono::duration<double>;
using std::chrono::milliseconds;

constexpr int64_t kMaxFrames = 1000000000000;
constexpr milliseconds kRedrawPeriod(200);
constexpr milliseconds kLinePeriod(1000);

struct RecordOptions {
    uint64_t frames = 0;
    double seconds = 0;
    std::string output;
};

std::string summary(const FrameStats& stats, double seconds) {
    const double rate = seconds > 0 ? static_cast<double>(stats.frames) / seconds : 0.0;
    if (settings().json) {
        return JsonObject()
                .add("frames", static_cast<int64_t>(stats.frames))
                .add("bytes", static_cast<int64_t>(stats.bytes))
                .addReal("seconds", seconds)
                .addReal("rate", rate)
                .addFlag("sequenced", stats.sequenced)
                .add("lost", static_cast<int64_t>(stats.lost))
                .add("gaps", static_cast<int64_t>(stats.gaps))
                .add("corrupt", static_cast<int64_t>(stats.corrupt))
                .text();
    }
    return fmt::format("recorded {} frames, {} bytes in {:.1f} s, {:.1f} frames/s, {}, {} corrupt",
                       stats.frames, stats.bytes, seconds, rate, describeLosses(stats),
                       stats.corrupt);
}

/// Shows the progress of a recording now and then.
class Progress {
  public:
    explicit Progress(Clock::time_point start) : mStart(start), mShownAt(start) {}

    void update(const FrameStats& stats) {
        const Clock::time_point now = Clock::now();
        // What is to be read by a program ends with the summary, and holds nothing else.
        if (settings().json ||
            now - mShownAt < (mLine.isTerminal() ? kRedrawPeriod : kLinePeriod)) {
            return;
        }
        const double rate =
                static_cast<double>(stats.frames - mShownFrames) / Seconds(now - mShownAt).count();
        mLine.show(fmt::format("{:7.1f} s  {} frames  {:.1f} frames/s  {} bytes  {}",
                               Seconds(now - mStart).count(), stats.frames, rate, stats.bytes,
                               describeLosses(stats)));
        mShownAt = now;
        mShownFrames = stats.frames;
    }

  private:
    tools::LiveLine mLine{wordsDescriptor()};
    const Clock::time_point mStart;
    Clock::time_point mShownAt;
    uint64_t mShownFrames = 0;
};

/// A recording from its first call to its last.
class Recorder {
  public:
    explicit Recorder(const RecordOptions& options)
            : mOptions(options),
              mReceiver(options.output.empty() ? nullptr : &mFile, options.frames) {}

    int run() {
        int exitStatus = tools::kExitSuccess;
        mConnection = Connection::open(exitStatus);
        if (mConnection == nullptr) {
            return exitStatus;
        }
        mFacade = Connection::openFacade(exitStatus, &FrameReceiver::onFrame, &mReceiver);
        if (mFacade == nullptr || (exitStatus = prepare()) != tools::kExitSuccess) {
            return exitStatus;
        }
        const LastWords lastWords([this] { speakLast(); });
        mStart = Clock::now();
        exitStatus = startStream(*mFacade);
        if (exitStatus != tools::kExitSuccess) {
            return exitStatus;
        }
        watch();
        return finish();
    }

  private:
    int prepare() {
        const int exitStatus = preparePackets(*mFacade, mReceiver);
        if (exitStatus != tools::kExitSuccess) {
            return exitStatus;
        }
        if (mOptions.output.empty()) {
            return tools::kExitSuccess;
        }
        const Waiting waiting("while waiting for a reader of " + mOptions.output);
        if (!mFile.open(mOptions.output, mustStop)) {
            return mustStop() ? failStopped() : fail(mFile.problem());
        }
        return tools::kExitSuccess;
    }

    /// Returns when the recording is to end, for whatever reason.
    void watch() {
        Progress progress(mStart);
        while (!mustStop() && !mConnection->serviceDied()) {
            milliseconds patience = kWatchPeriod;
            if (mOptions.seconds > 0) {
                const Seconds left(mOptions.seconds - seconds());
                if (left.count() <= 0) {
                    break;
                }
                patience = std::min(patience, std::chrono::ceil<milliseconds>(left));
            }
            if (mReceiver.waitUntilDone(patience)) {
                break;
            }
            progress.update(mReceiver.stats());
        }
    }

    /// Stops the service, prints the summary, and judges how it went.
    int finish() {
        const double took = seconds();
        const int status = call("stopRecord", [this] { return mFacade->stopRecord(); });
        const FrameStats stats = mReceiver.stats();
        say(summary(stats, took));
        // A service that died before it sent anything leaves what the file held before.
        const bool isWritten = mOptions.output.empty() || stats.frames > 0 ||
                               (status == STATUS_NO_ERROR && !mConnection->serviceDied());
        if (isWritten && !mFile.close()) {
            return fail(
                    fmt::format("{} (it holds {} whole frames)", mFile.problem(), stats.frames));
        }
        if (mConnection->serviceDied()) {
            return fail(fmt::format("the service died after {} frames", stats.frames),
                        tools::kExitAbsent);
        }
        if (status != STATUS_NO_ERROR) {
            return failStatus("stopRecord", status);
        }
        if (stats.corrupt != 0) {
            return fail(fmt::format("{} corrupt frames; {}", stats.corrupt, stats.firstCorrupt));
        }
        return tools::kExitSuccess;
    }

    /// The process ends while a call, or the file, keeps the recording waiting.
    void speakLast() {
        mReceiver.tryStats(mLastStats);
        const std::string words = summary(mLastStats, seconds()) + "\n";
        if (wordsDescriptor() == STDOUT_FILENO) {
            tools::tryWriteOutput(words);
        } else {
            tools::writeError(words.substr(0, words.size() - 1));
        }
        note(mFile.isWithinFrame() ? fmt::format("{} ends within a frame, behind {} whole ones",
                                                 mOptions.output, mLastStats.frames)
                                   : "the service was not told that the recording ends");
    }

    double seconds() const { return Seconds(Clock::now() - mStart).count(); }

    const RecordOptions mOptions;
    std::unique_ptr<Connection> mConnection;
    frames::FrameFile mFile;
    FrameReceiver mReceiver;
    std::unique_ptr<ITouchCompanionFacade> mFacade;
    Clock::time_point mStart;
    FrameStats mLastStats;
};

int record(const RecordOptions& options) {
    if (isStandardOutput(options.output)) {
        giveOutputToData();
    }
    return Recorder(options).run();
}

}  // namespace

void addRecordCommand(CLI::App& app, Action& action) {
    auto options = std::make_shared<RecordOptions>();
    Command command(app, action, "record", "Record touch frames until told to stop");
    command.number("-n,--frames", options->frames, "End after so many frames", {1, kMaxFrames});
    addSecondsOption(command, options->seconds);
    command.option("-o,--output", "FILE", options->output,
                   "File to write the frames to, one after another; - is the standard output")
            .runs([options] { return record(*options); });
}

}  // namespace pemaro::zelkctl
