// SPDX-License-Identifier: Apache-2.0
#include <algorithm>
#include <chrono>
#include <deque>
#include <memory>
#include <optional>
#include <string>
#include <thread>
#include <vector>

#include "frames/FrameContent.h"
#include "tools/zelkctl/commands/Lasting.h"
#include "tools/zelkctl/commands/frames/FramesCommands.h"
#include "tools/zelkctl/services/Connection.h"
#include "tools/zelkctl/services/FrameStream.h"
#include "tools/zelkctl/terminal/HeatMap.h"
#include "tools/zelkctl/terminal/Json.h"
#include "tools/zelkctl/terminal/Output.h"
#include "tools/zelkctl/terminal/Report.h"
#include "tools/zelkctl/terminal/Screen.h"
#include "tools/zelkctl/terminal/Settings.h"
#include "tools/zelkctl/terminal/Supervisor.h"

namespace pemaro::zelkctl {
namespace {

using Clock = std::chrono::steady_clock;
using Seconds = std::chrono::duration<double>;
using std::chrono::milliseconds;

/// How often a terminal is drawn on, and how often a line is printed elsewhere.
constexpr milliseconds kDrawPeriod(40);
constexpr milliseconds kLinePeriod(1000);
/// A stream that stood still for so long is said to.
constexpr Seconds kQuietFor(1.5);
/// Over how long the rate is measured.
constexpr Seconds kRateSpan(1);
constexpr int kFingerColumns = 40;
constexpr int kMaxFingerLines = 3;

struct WatchFramesOptions {
    double seconds = 0;
};

/// Frames a second, over the last second.
class Rate {
  public:
    double update(Clock::time_point now, uint64_t frames) {
        mPoints.push_back({now, frames});
        while (mPoints.size() > 2 && now - mPoints[1].when >= kRateSpan) {
            mPoints.pop_front();
        }
        const Seconds passed = now - mPoints.front().when;
        return passed.count() > 0
                       ? static_cast<double>(frames - mPoints.front().frames) / passed.count()
                       : 0;
    }

  private:
    struct Point {
        Clock::time_point when;
        uint64_t frames;
    };
    std::deque<Point> mPoints;
};

/// What is shown at a moment.
struct View {
    FrameStats stats;
    double rate = 0;
    int hottest = 1;   ///< so far
    double quiet = 0;  ///< seconds since the last frame
    std::optional<frames::FrameContent> frame;
};

std::string fingerText(const frames::FingerRecord& finger) {
    return fmt::format("finger {} at {}, {}  peak {}", finger.id, finger.x, finger.y, finger.peak);
}

std::string statusText(const View& view) {
    const std::string number =
            view.frame ? fmt::format("frame {}", view.frame->header.sequence) : "no frame yet";
    const std::string pace = view.quiet > kQuietFor.count()
                                     ? fmt::format("nothing for {:.0f} s", view.quiet)
                                     : fmt::format("{:.1f} frames/s", view.rate);
    return fmt::format("{}  {}  {}  {} corrupt", number, pace, describeLosses(view.stats),
                       view.stats.corrupt);
}

std::string lineText(const View& view) {
    std::string text = statusText(view);
    if (view.frame) {
        for (const frames::FingerRecord& finger : view.frame->fingers) {
            text += "  " + fingerText(finger);
        }
    }
    return text;
}

std::string lineJson(const View& view) {
    JsonObject object;
    object.addTime("time", std::chrono::system_clock::now());
    object.add("frames", static_cast<int64_t>(view.stats.frames)).addReal("rate", view.rate);
    object.add("lost", static_cast<int64_t>(view.stats.lost));
    object.add("gaps", static_cast<int64_t>(view.stats.gaps));
    object.add("corrupt", static_cast<int64_t>(view.stats.corrupt));
    if (view.frame) {
        JsonArray fingers;
        for (const frames::FingerRecord& finger : view.frame->fingers) {
            fingers.add(JsonObject()
                                .add("finger", finger.id)
                                .add("x", finger.x)
                                .add("y", finger.y)
                                .add("peak", finger.peak));
        }
        object.add("sequence", view.frame->header.sequence).add("fingers", fingers);
        object.add("hottest", view.hottest);
    }
    return object.text();
}

/// The fingers side by side, as far as there is room.
std::vector<std::string> fingerLines(const View& view, int columns) {
    const size_t perLine = static_cast<size_t>(std::max(1, columns / kFingerColumns));
    std::vector<std::string> lines;
    for (size_t i = 0; view.frame && i < view.frame->fingers.size(); ++i) {
        if (i % perLine == 0) {
            if (lines.size() == kMaxFingerLines) {
                break;
            }
            lines.emplace_back();
        }
        lines.back() += fmt::format("{:<{}}", fingerText(view.frame->fingers[i]), kFingerColumns);
    }
    return lines;
}

/// The status on top, the map, and the fingers below, all within the terminal.
std::vector<std::string> screenLines(const View& view, const TerminalTraits& traits) {
    const auto columns = static_cast<size_t>(traits.columns);
    std::vector<std::string> lines = {statusText(view).substr(0, columns)};
    std::vector<std::string> fingers = fingerLines(view, traits.columns);
    // A map of a row or two shows less than the numbers.
    const int room = traits.rows - 1 - static_cast<int>(fingers.size());
    if (view.frame && room > 0) {
        HeatMapStyle style;
        style.columns = traits.columns;
        style.rows = room;
        style.colors = traits.colors;
        style.unicode = traits.unicode;
        style.full = view.hottest;
        const std::vector<std::string> map = drawHeatMap(*view.frame, style);
        lines.insert(lines.end(), map.begin(), map.end());
        if (map.empty()) {
            lines.push_back(std::string("the frames have no image").substr(0, columns));
        }
    }
    for (const std::string& line : fingers) {
        if (lines.size() < static_cast<size_t>(traits.rows)) {
            lines.push_back(line.substr(0, columns));
        }
    }
    return lines;
}

/// Follows a stream from its start to its end.
class StreamWatch {
  public:
    StreamWatch(LatestFrame& latest, const WatchFramesOptions& options)
            : mLatest(latest), mOptions(options), mStart(Clock::now()), mLastFrame(mStart) {}

    void run(const Connection& connection) {
        const bool draws = !settings().json && terminalTraits().isTerminal;
        std::optional<Screen> screen;
        if (draws) {
            screen.emplace();
        }
        const milliseconds period = draws ? kDrawPeriod : kLinePeriod;
        Clock::time_point due = mStart + period;
        while (!mustStop() && !connection.serviceDied() && !isOver()) {
            std::this_thread::sleep_for(std::min<Clock::duration>(kDrawPeriod, kWatchPeriod));
            update();
            if (Clock::now() < due) {
                continue;
            }
            due = std::max(due + period, Clock::now());
            if (draws ? !screen->draw(screenLines(mView, terminalTraits())) : !printLine()) {
                break;
            }
        }
    }

  private:
    bool isOver() const {
        return mOptions.seconds > 0 && Clock::now() - mStart >= Seconds(mOptions.seconds);
    }

    void update() {
        const Clock::time_point now = Clock::now();
        mView.stats = mLatest.receiver().stats();
        mView.rate = mRate.update(now, mView.stats.frames);
        std::vector<uint8_t> bytes;
        if (mLatest.take(&bytes)) {
            mView.frame = frames::readFrameContent(bytes.data());
            for (const int16_t cell : mView.frame->image) {
                mView.hottest = std::max<int>(mView.hottest, cell);
            }
            mLastFrame = now;
        }
        mView.quiet = Seconds(now - mLastFrame).count();
    }

    bool printLine() const {
        say(settings().json ? lineJson(mView) : lineText(mView));
        return !mustStop();
    }

    LatestFrame& mLatest;
    const WatchFramesOptions& mOptions;
    const Clock::time_point mStart;
    Clock::time_point mLastFrame;
    Rate mRate;
    View mView;
};

int watchFrames(const WatchFramesOptions& options) {
    int exitStatus = tools::kExitSuccess;
    const std::unique_ptr<Connection> connection = Connection::open(exitStatus);
    if (connection == nullptr) {
        return exitStatus;
    }
    LatestFrame latest;
    const auto facade = Connection::openFacade(exitStatus, &LatestFrame::onFrame, &latest);
    if (facade == nullptr) {
        return exitStatus;
    }
    exitStatus = preparePackets(*facade, latest.receiver());
    if (exitStatus == tools::kExitSuccess) {
        exitStatus = startStream(*facade);
    }
    if (exitStatus != tools::kExitSuccess) {
        return exitStatus;
    }
    const LastWords lastWords([] { note("the service was not told that the recording ends"); });
    StreamWatch(latest, options).run(*connection);
    const int status = call("stopRecord", [&] { return facade->stopRecord(); });
    const FrameStats stats = latest.receiver().stats();
    if (connection->serviceDied()) {
        return fail(fmt::format("the service died after {} frames", stats.frames),
                    tools::kExitAbsent);
    }
    if (status != STATUS_NO_ERROR) {
        return failStatus("stopRecord", status);
    }
    if (!settings().json) {
        say(fmt::format("watched {} frames, {}, {} corrupt", stats.frames, describeLosses(stats),
                        stats.corrupt));
    }
    return tools::kExitSuccess;
}

}  // namespace

void addFramesWatchCommand(CLI::App& frames, Action& action) {
    auto options = std::make_shared<WatchFramesOptions>();
    Command command(frames, action, "watch",
                    "Show the frames as they come, as a heat map in the terminal");
    addSecondsOption(command, options->seconds);
    command.details(
                   "Shown are how many frames there are a second and how many were lost, the image "
                   "as a heat map with the number of each finger at its place, and the positions "
                   "of the fingers. The map is as large as the terminal allows, in the colours "
                   "that it has according to TERM, COLORTERM and NO_COLOR. With --json, or where "
                   "there is no terminal, a line is printed each second.")
            .runs([options] { return watchFrames(*options); });
}

}  // namespace pemaro::zelkctl
