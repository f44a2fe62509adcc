// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/terminal/Supervisor.h"

#include <android-base/unique_fd.h>
#include <poll.h>
#include <signal.h>
#include <sys/eventfd.h>
#include <sys/signalfd.h>
#include <unistd.h>

#include <algorithm>
#include <atomic>
#include <chrono>
#include <mutex>
#include <thread>
#include <utility>
#include <vector>

#include "tools/common/LiveLine.h"
#include "tools/common/StandardOutput.h"
#include "tools/zelkctl/terminal/Report.h"
#include "tools/zelkctl/terminal/Settings.h"

namespace pemaro::zelkctl {
namespace {

using android::base::unique_fd;
using Clock = std::chrono::steady_clock;
using std::chrono::milliseconds;

/// How long a command that was asked to stop may take.
constexpr milliseconds kGrace(800);
/// How long what it finishes may take.
constexpr milliseconds kFinishGrace(10000);
/// How often calls are looked at, when they have a time, and when they are shown.
constexpr milliseconds kCallPeriod(20);
constexpr milliseconds kShowPeriod(200);
/// What takes no longer needs no word.
constexpr std::chrono::seconds kPatience(1);

struct Wait {
    uint64_t number;
    std::string what;
    bool isCall;
    Clock::time_point since;
};

std::mutex gLock;
std::vector<Wait> gWaits;
std::atomic<uint64_t> gLastWait{0};
std::vector<std::function<void()>> gLastWords;

/// What the standard error shows of a call. Locked last, and never while it is waited for anything.
std::mutex gShowing;
std::string gShownCall;

std::atomic<int> gFinishing{0};
std::atomic<Clock::time_point> gFinishedAt{Clock::time_point()};
std::atomic<bool> gMustStop{false};
/// The signal that asked to stop; 0 for the standard output.
std::atomic<int> gSignal{0};

int stopStatus() {
    return gSignal == 0 ? tools::kExitFailure : tools::kExitSignal + gSignal;
}

std::string stopReason() {
    return gSignal == 0 ? tools::outputProblem() : "interrupted";
}

tools::LiveLine& callLine() {
    static tools::LiveLine line(STDERR_FILENO);
    return line;
}

bool showsCalls() {
    return !settings().json && callLine().isTerminal();
}

/// Whether the terminal takes something now: one that is held back by Ctrl-S does not.
bool takesWords() {
    pollfd entry{STDERR_FILENO, POLLOUT, 0};
    return poll(&entry, 1, 0) > 0;
}

/// Tells of a call that takes long, the one that was made first.
void showLateCall() {
    const std::lock_guard<std::mutex> guard(gLock);
    const auto now = Clock::now();
    const auto late = std::find_if(gWaits.begin(), gWaits.end(), [&](const Wait& wait) {
        return wait.isCall && now - wait.since >= kPatience;
    });
    if (late == gWaits.end()) {
        return;
    }
    const auto waited = std::chrono::floor<std::chrono::seconds>(now - late->since);
    const std::string text =
            fmt::format("{}: waiting for the answer, {} s", late->what, waited.count());
    const std::lock_guard<std::mutex> showing(gShowing);
    if (text != gShownCall && takesWords()) {
        callLine().show(text);
        gShownCall = text;
    }
}

/// Ends the process while the command hangs.
[[noreturn]] void abandon(const std::string& reason, int status) {
    hideCall();
    // The command cannot go on in what the last words look at.
    const std::lock_guard<std::mutex> guard(gLock);
    for (auto words = gLastWords.rbegin(); words != gLastWords.rend(); ++words) {
        (*words)();
    }
    fail(reason, status);
    _exit(status);
}

[[noreturn]] void abandonStopped() {
    std::string reason = stopReason();
    {
        const std::lock_guard<std::mutex> guard(gLock);
        if (!gWaits.empty()) {
            const Wait& wait = gWaits.back();
            reason += wait.isCall ? ": " + wait.what +
                                            " was not answered, and may have been done or not"
                                  : " " + wait.what;
        }
    }
    abandon(reason, stopStatus());
}

/// Ends the process when a call takes too long.
void checkCalls(double timeout) {
    std::string late;
    {
        const std::lock_guard<std::mutex> guard(gLock);
        for (const Wait& wait : gWaits) {
            if (wait.isCall &&
                Clock::now() - wait.since >= std::chrono::duration<double>(timeout)) {
                late = wait.what;
            }
        }
    }
    if (!late.empty()) {
        abandon(fmt::format("{}: no answer within {:g} s", late, timeout), tools::kExitTimeout);
    }
}

/// The signals that ask to stop, which from now on are read and not handled. The threads that are
/// made later inherit that.
unique_fd takeSignals() {
    sigset_t signals;
    sigemptyset(&signals);
    for (const int number : {SIGINT, SIGTERM}) {
        // A shell may have them ignored for what it runs in the background.
        signal(number, SIG_DFL);
        sigaddset(&signals, number);
    }
    sigaddset(&signals, SIGHUP);
    pthread_sigmask(SIG_BLOCK, &signals, nullptr);
    return unique_fd(signalfd(-1, &signals, SFD_CLOEXEC));
}

/// The watch over one command.
class Watch {
  public:
    Watch(double callTimeout, int done) : mTimeout(callTimeout), mDone(done) {}

    /// Returns when the command has ended.
    void run() {
        pollfd entries[] = {{mDone, POLLIN, 0},
                            {mSignals.get(), POLLIN, 0},
                            // Its reader's end is told without being asked for.
                            {STDOUT_FILENO, 0, 0}};
        while (true) {
            const bool any = poll(entries, 3, patience()) > 0;
            if (any && entries[0].revents != 0) {
                return;
            }
            if (any && entries[1].revents != 0) {
                takeSignal();
            }
            if (any && entries[2].revents != 0) {
                entries[2].fd = -1;
                tools::noteOutputClosed();
                stop(0);
            }
            if (Clock::now() >= mDeadline) {
                extendDeadline();
            }
            if (mTimeout > 0) {
                checkCalls(mTimeout);
            }
            if (mShowsCalls) {
                showLateCall();
            }
        }
    }

  private:
    int patience() const {
        if (mTimeout > 0) {
            return static_cast<int>(kCallPeriod.count());
        }
        const auto most = static_cast<int>(mShowsCalls ? kShowPeriod.count() : -1);
        if (mDeadline == kNever) {
            return most;
        }
        const auto left = std::chrono::ceil<milliseconds>(mDeadline - Clock::now());
        const auto patience = static_cast<int>(std::max<int64_t>(left.count(), 0));
        return mShowsCalls ? std::min(patience, most) : patience;
    }

    /// What was finished until now has its time, and so has what comes behind it.
    void extendDeadline() {
        const auto now = Clock::now();
        mDeadline = (gFinishing > 0 ? now : gFinishedAt.load()) + kGrace;
        if (now >= mDeadline || now >= mLastDeadline) {
            abandonStopped();
        }
    }

    void takeSignal() {
        signalfd_siginfo info{};
        if (read(mSignals.get(), &info, sizeof(info)) != sizeof(info)) {
            return;
        }
        const bool again = gSignal != 0;
        stop(static_cast<int>(info.ssi_signo));
        if (again) {
            abandonStopped();
        }
    }

    void stop(int signal) {
        gSignal = signal;
        gMustStop = true;
        if (mDeadline == kNever) {
            mDeadline = Clock::now() + kGrace;
            mLastDeadline = Clock::now() + kFinishGrace;
        }
    }

    static constexpr Clock::time_point kNever = Clock::time_point::max();

    const double mTimeout;
    const int mDone;
    const bool mShowsCalls = showsCalls();
    const unique_fd mSignals = takeSignals();
    Clock::time_point mDeadline = kNever;
    Clock::time_point mLastDeadline = kNever;
};

}  // namespace

void hideCall() {
    const std::lock_guard<std::mutex> guard(gShowing);
    if (!gShownCall.empty() && takesWords()) {
        callLine().clear();
    }
    gShownCall.clear();
}

int supervise(const std::function<int()>& command, double callTimeout) {
    const unique_fd done(eventfd(0, EFD_CLOEXEC));
    Watch watch(callTimeout, done.get());
    int status = 0;
    std::thread thread([&] {
        status = command();
        eventfd_write(done.get(), 1);
    });
    watch.run();
    thread.join();
    const std::string problem = tools::outputProblem();
    if (!problem.empty() && status != stopStatus()) {
        fail(problem);
    }
    return problem.empty() || status != tools::kExitSuccess ? status : tools::kExitFailure;
}

bool mustStop() {
    return gMustStop || !tools::outputProblem().empty();
}

int failStopped() {
    return fail(stopReason(), stopStatus());
}

Waiting::Waiting(const std::string& what, bool isCall) : mNumber(++gLastWait) {
    const std::lock_guard<std::mutex> guard(gLock);
    gWaits.push_back({mNumber, what, isCall, Clock::now()});
}

/// Threads may wait for several things at once, and end in any order.
Waiting::~Waiting() {
    {
        const std::lock_guard<std::mutex> guard(gLock);
        gWaits.erase(std::find_if(gWaits.begin(), gWaits.end(),
                                  [this](const Wait& wait) { return wait.number == mNumber; }));
    }
    hideCall();
}

Finishing::Finishing() {
    gFinishing += 1;
}

Finishing::~Finishing() {
    gFinishedAt = Clock::now();
    gFinishing -= 1;
}

LastWords::LastWords(std::function<void()> speak) {
    const std::lock_guard<std::mutex> guard(gLock);
    gLastWords.push_back(std::move(speak));
}

LastWords::~LastWords() {
    const std::lock_guard<std::mutex> guard(gLock);
    gLastWords.pop_back();
}

}  // namespace pemaro::zelkctl
