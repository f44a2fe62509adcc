// SPDX-License-Identifier: Apache-2.0
#include <chrono>
#include <memory>
#include <string>
#include <thread>

#include "tools/zelkctl/commands/Commands.h"
#include "tools/zelkctl/commands/Lasting.h"
#include "tools/zelkctl/services/Companion.h"

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
    int status = call("setRecordOutput", [&] { return client.setRecordOutput(kOutputFile); });
    if (status != STATUS_NO_ERROR) {
        return {"setRecordOutput", status};
    }
    status = call("setRecordFile", [&] { return client.setRecordFile(path); });
    if (status != STATUS_NO_ERROR) {
        return {"setRecordFile", status};
    }
    status = call("startRecord", [&] { return client.startRecord(); });
    return {status == STATUS_NO_ERROR ? nullptr : "startRecord", status};
}

/// Returns when the recording is to end, for whatever reason; the seconds that it took.
double wait(double seconds, const Connection& connection) {
    const Clock::time_point begin = Clock::now();
    Seconds passed(0);
    while (!mustStop() && !connection.serviceDied() && (seconds == 0 || passed.count() < seconds)) {
        const Seconds left(seconds - passed.count());
        std::this_thread::sleep_for(seconds == 0 || left > kWatchPeriod ? Seconds(kWatchPeriod)
                                                                        : left);
        passed = Clock::now() - begin;
    }
    return passed.count();
}

int recordFile(const RecordFileOptions& options) {
    int exitStatus = tools::kExitSuccess;
    const std::unique_ptr<Connection> connection = Connection::open(exitStatus);
    if (connection == nullptr) {
        return exitStatus;
    }
    const android::sp<TouchCompanionClient> client = Connection::openClient(exitStatus);
    if (client == nullptr) {
        return exitStatus;
    }
    const LastWords lastWords([] { note("the service was not told that the recording ends"); });
    const Outcome started = start(*client, options.path);
    if (started.operation != nullptr) {
        return failStatus(started.operation, started.status, options.path);
    }
    sayResult("recording to " + options.path, JsonObject().add("recording", options.path));
    const double seconds = wait(options.seconds, *connection);
    const int status = call("stopRecord", [&] { return client->stopRecord(); });
    if (connection->serviceDied()) {
        return fail(fmt::format("the service died after {:.1f} s", seconds), tools::kExitAbsent);
    }
    if (status != STATUS_NO_ERROR) {
        return failStatus("stopRecord", status, options.path);
    }
    sayResult(fmt::format("recorded {:.1f} s", seconds),
              JsonObject().add("recorded", options.path).addReal("seconds", seconds));
    return tools::kExitSuccess;
}

}  // namespace

void addRecordFileCommand(CLI::App& app, Action& action) {
    auto options = std::make_shared<RecordFileOptions>();
    Command command(app, action, "record-file",
                    "Make the service record to a file of its own until told to stop");
    command.operand("PATH", options->path, "The file as the service sees it");
    addSecondsOption(command, options->seconds);
    command.runs([options] { return recordFile(*options); });
}

}  // namespace pemaro::zelkctl
