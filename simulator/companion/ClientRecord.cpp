// SPDX-License-Identifier: Apache-2.0
#include "simulator/companion/ClientRecord.h"

#include <algorithm>
#include <utility>

#include "pemaro/Status.h"
#include "simulator/companion/FileWriter.h"
#include "simulator/companion/GeneratedFrames.h"
#include "simulator/companion/ReplayedFrames.h"
#include "simulator/touchscreen/TouchScreen.h"

namespace pemaro::simulator {
namespace {

constexpr int kOutputFile = 0;
constexpr int kOutputMemory = 1;

std::unique_ptr<FrameSource> makeSource(const SimulatorOptions& options) {
    if (options.replay != nullptr) {
        return std::make_unique<ReplayedFrames>(options.replay, options.speed, options.loop);
    }
    if (const auto& screen = options.touchScreen; screen != nullptr) {
        return std::make_unique<GeneratedFrames>(
                frames::FrameGenerator(options.frameBytes, screen->maxFingers()), options.rate,
                [screen] { return screen->fingers(); });
    }
    return std::make_unique<GeneratedFrames>(
            frames::FrameGenerator(options.frameBytes, options.fingers), options.rate);
}

}  // namespace

ClientRecord::ClientRecord(pid_t pid, const SimulatorOptions& options,
                           std::shared_ptr<const std::atomic<uint32_t>> filter)
        : mPid(pid), mOptions(options), mFilter(std::move(filter)) {}

android::sp<android::IBinder> ClientRecord::takeHandle() {
    android::sp<android::IBinder> handle = mHandles.back();
    mHandles.pop_back();
    return handle;
}

bool ClientRecord::removeHandle(const android::IBinder* handle) {
    const auto found =
            std::find_if(mHandles.begin(), mHandles.end(),
                         [handle](const auto& candidate) { return candidate.get() == handle; });
    if (found == mHandles.end()) {
        return false;
    }
    mHandles.erase(found);
    return true;
}

int ClientRecord::setOutput(int output) {
    if (output != kOutputFile && output != kOutputMemory) {
        return STATUS_BAD_PARAMETER;
    }
    if (isRecording()) {
        return STATUS_INVALID_STATE;
    }
    mOutput = output;
    return STATUS_NO_ERROR;
}

int ClientRecord::setFile(const std::string& path) {
    if (path.empty()) {
        return STATUS_INVALID_FILE_PATH;
    }
    mFile = path;
    return STATUS_NO_ERROR;
}

int ClientRecord::prepare() {
    if (!mOpen || mOutput < 0 || isRecording()) {
        return STATUS_INVALID_STATE;
    }
    mRing.reset();
    mPrepared = false;
    if (mOutput == kOutputMemory) {
        auto writer = RingWriter::create(mOptions.frameBytes, mOptions.ringFrames);
        if (writer == nullptr) {
            return STATUS_ERROR_ALLOCATING_MEMORY;
        }
        mRing = std::make_shared<RingSink>(std::move(writer));
    }
    mPrepared = true;
    return STATUS_NO_ERROR;
}

android::sp<android::IMemory> ClientRecord::block() const {
    const bool ready = mPrepared && mRing != nullptr && !isRecording();
    return ready ? mRing->memory() : nullptr;
}

int ClientRecord::start() {
    if (!mOpen || !mPrepared || isRecording()) {
        return STATUS_INVALID_STATE;
    }
    std::shared_ptr<FrameSink> sink = mRing;
    if (sink == nullptr) {
        if (mFile.empty()) {
            return STATUS_INVALID_FILE_PATH;
        }
        sink = FileWriter::open(mFile);
        if (sink == nullptr) {
            return STATUS_ERROR_OPENING_FILE;
        }
    }
    mRecording = std::make_unique<Recording>(sink, makeSource(mOptions), mFilter,
                                             std::chrono::microseconds(mOptions.remindUs));
    return STATUS_NO_ERROR;
}

int ClientRecord::stop(Recording::Counts* counts) {
    if (!isRecording()) {
        return STATUS_INVALID_STATE;
    }
    *counts = mRecording->stop();
    mRecording.reset();
    mRing.reset();
    mPrepared = false;
    return STATUS_NO_ERROR;
}

}  // namespace pemaro::simulator
