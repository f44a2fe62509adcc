// SPDX-License-Identifier: Apache-2.0

// soak-client ROLE SEED REPORT: works without a pause until SIGTERM or its service's death, and then lets go of
// the service. Roles: recorder, commander, watcher, the last with nine clients of each manager.

#include <binder/ProcessState.h>
#include <signal.h>
#include <unistd.h>

#include <chrono>
#include <cstdlib>
#include <optional>
#include <random>
#include <string>
#include <thread>
#include <vector>

#include "frames/Frame.h"
#include "pemaro/GestureManagerClient.h"
#include "pemaro/HandBiometricManagerClient.h"
#include "pemaro/Status.h"
#include "pemaro/TouchCompanionClient.h"
#include "pemaro/TouchCompanionSharedCblk.h"
#include "pemaro/TouchManagerClient.h"
#include "simulator/managers/GestureRecord.h"
#include "simulator/managers/HandRecord.h"
#include "tests/driver/ProcessUsage.h"
#include "tests/driver/soak/SoakReport.h"

namespace {

using namespace pemaro;
using android::sp;
using test::SoakReport;

constexpr int kWatchersOfAKind = 9;

volatile sig_atomic_t gStop = 0;

class Client {
  public:
    Client(SoakReport& report, unsigned seed) : mReport(report), mRandom(seed) {}

    int record();
    int command();
    int watch();

    /// When everything of the work is let go of. What the driver has a part in goes a little later.
    void tellUsageAfterwards();

  private:
    int upTo(int most) { return std::uniform_int_distribution<int>(0, most)(mRandom); }

    void pause(int mostMs) { std::this_thread::sleep_for(std::chrono::milliseconds(upTo(mostMs))); }

    /// A failed transaction or lookup means that the service has died, which a test may well do.
    bool check(const char* operation, int status, int allowed = STATUS_NO_ERROR) {
        mReport.operations += 1;
        if (status == STATUS_UNKNOWN_ERROR || status == STATUS_ERROR_ACQUIRING_RESOURCE) {
            gStop = 1;
        } else if (status != STATUS_NO_ERROR && status != allowed) {
            mReport.fail(std::string(operation) + ": " + errStr(status));
            gStop = 1;
        }
        return status == STATUS_NO_ERROR;
    }

    static void onFrame(int, void* frame, unsigned long bytes, void* context) {
        static_cast<Client*>(context)->take(frame, bytes);
    }
    void take(const void* frame, size_t bytes);

    template <typename Record>
    static void onGesture(Record* record, void* context) {
        static_cast<Client*>(context)->countEvent(simulator::readGestureRecord(record) != nullptr);
    }
    static void onHand(IHandBiometricManagerClient::HandBioData* record, void* context) {
        static_cast<Client*>(context)->countEvent(simulator::readHandRecord(record) != nullptr);
    }
    void countEvent(bool intact) {
        mReport.events += 1;
        if (!intact) {
            mReport.fail("an event is not intact");
        }
    }

    void commandOnce(TouchCompanionClient& client);
    void checkUsage();

    static void tellUsage(test::SoakUsage& usage) {
        const test::ProcessUsage now(getpid());
        usage.threads = now.threads;
        usage.mappings = now.mappings;
        usage.memoryKiB = now.memoryKiB;
        usage.descriptors = now.descriptors;
    }

    void ready() {
        tellUsage(mReport.atWork);
        mReport.ready = 1;
    }

    SoakReport& mReport;
    std::mt19937 mRandom;
    const TouchCompanionSharedCblk* mBlock = nullptr;
    test::SoakRecording* mRecording = nullptr;
    uint32_t mNextSequence = 0;
    std::optional<test::ProcessUsage> mUsage;
};

void Client::tellUsageAfterwards() {
    for (int i = 0; i < 500; ++i) {
        tellUsage(mReport.afterwards);
        if (mReport.ready == 0 || mReport.afterwards.descriptors <= mReport.atWork.descriptors) {
            return;
        }
        std::this_thread::sleep_for(std::chrono::milliseconds(10));
    }
}

/// What is in the ring comes, one frame after another: the index tells of each that it is the next. So
/// those whose numbers are missing were not written, for want of room.
void Client::take(const void* frame, size_t bytes) {
    if (mRecording->received == 0) {
        // A recording has a ring of its own, and its first frame is the first in there.
        mBlock = reinterpret_cast<const TouchCompanionSharedCblk*>(
                static_cast<const uint8_t*>(frame) - kTouchCompanionRingOffset);
    }
    mRecording->written = TouchCompanionSharedCblk::acquireIndex(mBlock->write);
    if (mBlock->read != mRecording->received) {
        mReport.fail("frame " + std::to_string(mRecording->received) +
                     " of the ring is the reader's number " + std::to_string(mBlock->read));
        return;
    }
    frames::FrameHeader header{};
    const char* fault = frames::frameFault(frame, bytes);
    if (fault != nullptr || !frames::readFrameHeader(frame, bytes, &header)) {
        mReport.fail(std::string("a frame: ") + (fault == nullptr ? "no header" : fault));
        return;
    }
    if (header.sequence < mNextSequence) {
        mReport.fail("frame " + std::to_string(header.sequence) + " came twice");
        return;
    }
    mRecording->missing += header.sequence - mNextSequence;
    mRecording->received += 1;
    mNextSequence = header.sequence + 1;
}

int Client::record() {
    sp<TouchCompanionClient> client = new TouchCompanionClient(onFrame, this);
    if (!check("init", client->init()) || !check("setRecordOutput", client->setRecordOutput(1))) {
        return 0;
    }
    ready();
    while (gStop == 0) {
        mRecording = &mReport.recording[mReport.recordings % SoakReport::kMostRecordings];
        mNextSequence = 0;
        if (!check("startRecord", client->startRecord())) {
            break;
        }
        mReport.recordings += 1;
        for (int left = upTo(20); left > 0 && gStop == 0; --left) {
            pause(50);
        }
        if (check("stopRecord", client->stopRecord())) {
            checkUsage();
        }
    }
    return 0;
}

/// A recording that has ended uses nothing that the first one did not.
void Client::checkUsage() {
    constexpr int kLeeway = 10;  // Binder's threads and the allocator's heaps
    const test::ProcessUsage now(getpid());
    if (!mUsage) {
        mUsage = now;
    } else if (now.descriptors > mUsage->descriptors || now.threads > mUsage->threads + kLeeway ||
               now.mappings > mUsage->mappings + 4 * kLeeway) {
        mReport.fail("recordings use things up");
    }
}

void Client::commandOnce(TouchCompanionClient& client) {
    switch (upTo(6)) {
        case 0: {
            const int bytes = upTo(20000);
            char* answer = nullptr;
            const std::string command = "dump " + std::to_string(bytes);
            if (check("dump", client.sendCommand(command.c_str(), &answer)) &&
                std::string(answer).size() != static_cast<size_t>(bytes)) {
                mReport.fail(command + " brought another length");
            }
            free(answer);
            break;
        }
        case 1: {
            SerializableMap wanted;
            wanted.add("gain", 0);
            wanted.add("edge.zones", 0);
            check("getConfigParams", client.getConfigParams(wanted));
            break;
        }
        case 2: {
            std::vector<uint8_t> bytes(16384);
            size_t length = bytes.size();
            if (check("getConfigParams", client.getConfigParams(bytes.data(), &length))) {
                check("setConfigParams", client.setConfigParams(bytes.data(), length));
            }
            break;
        }
        case 3: {
            int session = 0;
            if (check("saveSession", client.saveSession(session))) {
                check("restoreSession", client.restoreSession(session));
            }
            break;
        }
        case 4:
            check("setProperty", client.setProperty("setRollingLogSize", "512"));
            break;
        case 5:
            check("setRecordFilter", client.setRecordFilter(3));
            break;
        default:
            check("sendEvent", client.sendEvent(eventType(1), eventParam(upTo(100))));
            break;
    }
}

int Client::command() {
    sp<TouchCompanionClient> client = new TouchCompanionClient;
    if (!check("init", client->init())) {
        return 0;
    }
    ready();
    while (gStop == 0) {
        commandOnce(*client);
        pause(20);
        if (upTo(50) == 0) {
            client = new TouchCompanionClient;
            check("init", client->init());
        }
    }
    return 0;
}

int Client::watch() {
    std::vector<sp<TouchManagerClient>> touch;
    std::vector<sp<GestureManagerClient>> gesture;
    std::vector<sp<HandBiometricManagerClient>> hand;
    for (int i = 0; i < kWatchersOfAKind && gStop == 0; ++i) {
        touch.push_back(new TouchManagerClient(onGesture, this));
        gesture.push_back(new GestureManagerClient(onGesture, nullptr, this));
        hand.push_back(new HandBiometricManagerClient(onHand, nullptr, this));
        check("init", touch.back()->init());
        check("init", gesture.back()->init());
        check("init", hand.back()->init());
    }
    ready();
    while (gStop == 0) {
        const auto which = static_cast<size_t>(upTo(static_cast<int>(hand.size()) - 1));
        check("enable", touch[which]->enable(1 + upTo(3)));
        check("startGestureDetection", gesture[which]->startGestureDetection());
        // Another client may have started something else.
        check("startMatching", hand[which]->startMatching(), STATUS_INVALID_STATE);
        pause(200);
        check("stopMatching", hand[which]->stopMatching(), STATUS_INVALID_STATE);
        // The other two would look for a service that has died for the better part of a minute.
        if (upTo(10) == 0) {
            touch[which]->deinit();
            check("init", touch[which]->init());
        }
    }
    for (size_t i = 0; i < touch.size(); ++i) {
        touch[i]->deinit();
        gesture[i]->deinit();
        hand[i]->deinit();
    }
    return 0;
}

}  // namespace

int main(int argc, char** argv) {
    if (argc != 4) {
        return 2;
    }
    const std::string role = argv[1];
    SoakReport* report = pemaro::test::mapSoakReport(argv[3], false);
    if (report == nullptr) {
        return 2;
    }
    struct sigaction stop = {};
    stop.sa_handler = [](int) { gStop = 1; };
    sigaction(SIGTERM, &stop, nullptr);
    android::ProcessState::self()->startThreadPool();
    Client client(*report, static_cast<unsigned>(strtoul(argv[2], nullptr, 10)));
    const int status = role == "recorder"    ? client.record()
                       : role == "commander" ? client.command()
                       : role == "watcher"   ? client.watch()
                                             : 2;
    client.tellUsageAfterwards();
    // Binder's threads are still at work: nothing of what they use may be destroyed.
    _exit(status);
}
