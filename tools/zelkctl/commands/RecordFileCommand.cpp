// SPDX-License-Identifier: Apache-2.0
#include <CLI/CLI.hpp>
#include <chrono>
#include <memory>
#include <string>
#include <thread>

#include "tools/zelkctl/commands/Commands.h"
#include "tools/zelkctl/commands/Lasting.h"
#include "tools/zelkctl/services/Companion.h"
#include "tools/zelkctl/terminal/StopSignal.h"

namespace pemaro::zelkctl {
namespace {

using Clock = std::chrono::steady_clock;
using Seconds = std::chrono::duration<double>;

constexpr int kOutputFile = 0;

struct RecordFileOptions {
    std::string path;
    double seconds = 0;
};

/// The operation that failed, or null, and its status.
struct Outcome {
    const char* operation = nullptr;
    int status = STATUS_NO_ERROR;
};

Outcome start(TouchCompanionClient& client, const std::string& path) {
    int status = client.setRecordOutput(kOutputFile);
    if (status != STATUS_NO_ERROR) {
        return {"setRecordOutput", status};
    }
    status = client.setRecordFile(path);
    if (status != STATUS_NO_ERROR) {
        return {"setRecordFile", status};
    }
    status = client.startRecord();
    return {status == STATUS_NO_ERROR ? nullptr : "startRecord", status};
}

/// Returns when the recording is to end, for whatever reason; the seconds that it took.
double wait(double seconds, const Connection& connection, const StopSignal& stopSignal) {
    const Clock::time_point begin = Clock::now();
    Seconds passed(0);
    while (!stopSignal.caught() && !connection.serviceDied() &&
           (seconds == 0 || passed.count() < seconds)) {
        const Seconds left(seconds - passed.count());
        std::this_thread::sleep_for(seconds == 0 || left > kWatchPeriod ? Seconds(kWatchPeriod)
                                                                        : left);
        passed = Clock::now() - begin;
    }
    return passed.count();
}

int recordFile(const RecordFileOptions& options) {
    const StopSignal stopSignal;
    const std::unique_ptr<Connection> connection = Connection::open();
    if (connection == nullptr) {
        return tools::kExitFailure;
    }
    const android::sp<TouchCompanionClient> client = Connection::openClient();
    if (client == nullptr) {
        return tools::kExitFailure;
    }
    const Outcome started = start(*client, options.path);
    if (started.operation != nullptr) {
        return failStatus(started.operation, started.status, options.path);
    }
    fmt::print("recording to {}\n", options.path);
    fflush(stdout);
    const double seconds = wait(options.seconds, *connection, stopSignal);
    const int status = client->stopRecord();
    if (connection->serviceDied()) {
        return fail(fmt::format("the service died after {:.1f} s", seconds));
    }
    if (status != STATUS_NO_ERROR) {
        return failStatus("stopRecord", status, options.path);
    }
    fmt::print("recorded {:.1f} s\n", seconds);
    return tools::kExitSuccess;
}

}  // namespace

void addRecordFileCommand(CLI::App& app, Action& action) {
    auto options = std::make_shared<RecordFileOptions>();
    CLI::App* command = app.add_subcommand(
            "record-file", "Make the service record to a file of its own until told to stop");
    command->add_option("PATH", options->path, "The file as the service sees it")->required();
    addSecondsOption(*command, options->seconds);
    command->callback([=, &action] { action = [=] { return recordFile(*options); }; });
}

}  // namespace pemaro::zelkctl
