// SPDX-License-Identifier: Apache-2.0
#define LOG_TAG "TouchCompanionClient"

#include "pemaro/TouchCompanionClient.h"

#include <binder/IPCThreadState.h>
#include <log/log.h>
#include <utils/Timers.h>

#include <algorithm>
#include <cstring>

#include "binder/PlatformShims.h"
#include "binder/ServiceLookup.h"
#include "binder/Waiting.h"
#include "companion/TouchCompanionThread.h"
#include "pemaro/Status.h"

namespace pemaro {

using android::IBinder;
using android::IInterface;
using android::IPCThreadState;
using android::sp;

namespace {

constexpr char kServiceName[] = "pemaro.TouchService";

constexpr int kOutputNone = -1;
constexpr int kOutputFile = 0;
constexpr int kOutputMemory = 1;

// The ring is looked at in steps of one wait; a recording without frames is reported about once a
// second.
constexpr int kRingWaitMs = 16;
constexpr int kRingTimeoutMs = 1000;

constexpr int64_t kNanosPerSecond = 1000000000;
constexpr long kNanosPerMs = 1000000;

// A frame tells its own length in bytes here, as an unsigned 32-bit number.
constexpr size_t kFrameLengthOffset = 8;

timespec deadlineIn(int milliseconds) {
    timespec deadline;
    clock_gettime(CLOCK_REALTIME, &deadline);
    deadline.tv_nsec += milliseconds * kNanosPerMs;
    if (deadline.tv_nsec >= kNanosPerSecond) {
        deadline.tv_sec += 1;
        deadline.tv_nsec -= kNanosPerSecond;
    }
    return deadline;
}

// One wait for the writer's signal. The lock has the same deadline: a service that dies while it
// holds the mutex must not take the recording thread, and whoever joins it, along.
void waitForWriter(TouchCompanionSharedCblk* cblk) {
    timespec deadline = deadlineIn(kRingWaitMs);
    if (pthread_mutex_timedlock(&cblk->mutex, &deadline) != 0) {
        return;
    }
    waitHooks().condTimedWait(&cblk->cond, &cblk->mutex, &deadline);
    pthread_mutex_unlock(&cblk->mutex);
}

}  // namespace

// ---- connection ----

TouchCompanionClient::TouchCompanionClient() : TouchCompanionClient(nullptr, nullptr) {}

TouchCompanionClient::TouchCompanionClient(DataCallback callback, void* context)
        : mCallback(callback), mContext(context), mRecordOutput(kOutputNone) {}

TouchCompanionClient::~TouchCompanionClient() {
    if (mInitialized) {
        mService->unregisterClient();
    }
    // Whatever init() returned: who could not open the service may have recorded all the same, and
    // the thread works on this object.
    if (mThread != nullptr) {
        mThread->requestExit();
        mThread->requestExitAndWait();
        mThread.clear();
    }
    if (mInitialized) {
        IPCThreadState::self()->flushCommands();
    }
    mBinderHandle.clear();
    mCblkMemory.clear();
    mService.clear();
}

int TouchCompanionClient::init() {
    sp<IBinder> binder = findService(LOG_TAG, kServiceName);
    if (binder == nullptr) {
        return STATUS_ERROR_ACQUIRING_RESOURCE;
    }
    mService = ITouchCompanionService::asInterface(binder);
    if (mService == nullptr) {
        ALOGE("wrong service interface?");
        return STATUS_BAD_PARAMETER;
    }
    mBinderHandle = new BinderHandle();
    int status = mService->registerClient(mBinderHandle);
    if (status != STATUS_NO_ERROR) {
        ALOGE("registerClient failed");
        return status;
    }
    status = mService->open();
    if (status != STATUS_NO_ERROR) {
        ALOGE("init service failed");
        return status;
    }
    mInitialized = true;
    ALOGE("Init successfully");
    return STATUS_NO_ERROR;
}

int TouchCompanionClient::pingService() {
    sp<IBinder> binder = IInterface::asBinder(mService);
    if (binder == nullptr) {
        ALOGD("binder error");
        return 0;
    }
    return binder->pingBinder() == android::NO_ERROR ? 1 : 0;
}

// ---- recording ----

int TouchCompanionClient::setRecordOutput(int output) {
    if (mService == nullptr) {
        return STATUS_INVALID_STATE;
    }
    mRecordOutput = output;
    int status = mService->setRecordParameter(output);
    if (status != STATUS_NO_ERROR) {
        ALOGE("output parameter(%d) is wrong", output);
    }
    return status;
}

int TouchCompanionClient::setRecordFile(const std::string& path) {
    if (mService == nullptr) {
        return STATUS_INVALID_STATE;
    }
    if (mRecordOutput != kOutputFile) {
        ALOGE("setRecordFile can be called only with OUTPUT_FILE option");
        return STATUS_BAD_PARAMETER;
    }
    int status = mService->setRecordFile(path);
    if (status != STATUS_NO_ERROR) {
        ALOGE("setDumpFile failed");
    }
    return status;
}

int TouchCompanionClient::startRecord() {
    if (mService == nullptr) {
        return STATUS_INVALID_STATE;
    }
    if (mRecordOutput == kOutputNone) {
        ALOGE("recording parameter is wrong(%d)", mRecordOutput);
        return STATUS_BAD_PARAMETER;
    }
    int status = mService->prepareRecord();
    if (status != STATUS_NO_ERROR) {
        ALOGE("fail to prepare recording");
        return status;
    }
    if (mRecordOutput == kOutputMemory) {
        status = mapBlock();
        if (status != STATUS_NO_ERROR) {
            return status;
        }
        startThread();
    }
    status = mService->startRecord();
    if (status != STATUS_NO_ERROR) {
        ALOGE("startRecord failed");
    }
    return status;
}

int TouchCompanionClient::mapBlock() {
    // A recording that was started twice has a thread in the old block.
    endThread();
    sp<android::IMemory> memory = mService->getCblk();
    if (memory == nullptr) {
        ALOGE("couldn't get shared control block");
        return STATUS_ERROR_ACQUIRING_RESOURCE;
    }
    mFrameCount = 0;
    mStartTime = 0;
    mLastSecond = 0;
    mCblkMemory = memory;
    mCblk = static_cast<TouchCompanionSharedCblk*>(mappedAddress(memory));
    if (mCblk != nullptr && memory->size() < sizeof(TouchCompanionSharedCblk)) {
        mCblk = nullptr;
    }
    if (mCblk == nullptr) {
        return STATUS_ERROR_ACQUIRING_RESOURCE;
    }
    mCblk->data = mCblk->frames();
    return STATUS_NO_ERROR;
}

void TouchCompanionClient::startThread() {
    if (mCallback == nullptr) {
        return;
    }
    ALOGD("Init: callback is set, create DebugThread");
    mThread = new TouchCompanionThread(*this);
    mThread->run("TouchCompanionThread", 0, 0);
}

void TouchCompanionClient::endThread() {
    if (mThread == nullptr) {
        return;
    }
    mThread->printRefs();
    mThread->requestExitAndWait();
    mThread.clear();
}

int TouchCompanionClient::stopRecord() {
    if (mService == nullptr) {
        return STATUS_INVALID_STATE;
    }
    ALOGD("stopRecord: E");
    endThread();
    ALOGD("stopRecord: call stopRecord on remote side");
    int status = mService->stopRecord();
    if (status != STATUS_NO_ERROR) {
        ALOGE("stopRecord failed");
        return status;
    }
    ALOGD("stopRecord: clear shared memory");
    mCblkMemory.clear();
    mCblk = nullptr;
    return STATUS_NO_ERROR;
}

int TouchCompanionClient::read(void* /* buffer */, unsigned long /* size */) {
    return 0;
}

// ---- the ring ----

int TouchCompanionClient::acquireBuffer(FrameBuffer* buffer) {
    sp<android::IMemory> keepMapped = mCblkMemory;
    if (mCblk == nullptr) {
        return STATUS_INVALID_STATE;
    }
    const uint32_t frameSize = mCblk->frameSize;
    const uint32_t bufferFrames = mCblk->bufferFrames;
    const uint32_t read = mCblk->read;
    uint32_t write = TouchCompanionSharedCblk::acquireIndex(mCblk->write);
    const uint32_t wanted = frameSize == 0 ? 0 : static_cast<uint32_t>(buffer->size / frameSize);
    uint32_t available = write - read;
    ALOGD("acquireBuffer: write = %u, read = %u, reqSize = %u, availaSize = %u", write, read,
          wanted, available);
    if (write == read) {
        int status = waitForFrames(write, available);
        if (status != STATUS_NO_ERROR) {
            return status;
        }
    }
    ALOGD("acquireBuffer: write = %u, read = %u, reqSize = %d, availSize = %u", write, read,
          static_cast<int>(wanted), available);

    uint32_t frames = std::min(available, wanted);
    const uint32_t bufferEnd = (mCblk->readWrap + 1) * bufferFrames;
    ALOGD("acquireBuffer: read = %u, bufferEnd = %u", read, bufferEnd);
    frames = std::min(bufferEnd - read, frames);
    ALOGD("acquireBuffer: new reqSize = %u", frames);

    const uint32_t slot = read - bufferFrames * mCblk->readWrap;
    // A number until it is used: the other side can write anything into the block.
    const uintptr_t first = reinterpret_cast<uintptr_t>(mCblk->data);
    buffer->data = reinterpret_cast<void*>(first + slot * frameSize);
    buffer->frameCount = frames;
    buffer->size = frameSize * frames;
    ALOGD("acquireBuffer: data = %p, size = %zu, frameCount = %u", buffer->data, buffer->size,
          buffer->frameCount);
    return STATUS_NO_ERROR;
}

// Waits until `write` moves. The frames are counted from the look before the last wait, and the
// time is judged before the frames: those that arrive in the 63rd wait are left to the next call.
int TouchCompanionClient::waitForFrames(uint32_t& write, uint32_t& available) {
    for (int waitedMs = 0;;) {
        const uint32_t seen = TouchCompanionSharedCblk::acquireIndex(mCblk->write);
        available = seen - write;
        ALOGD("acquireBuffer: availaSize = %d, wait for sometime", static_cast<int>(available));
        waitForWriter(mCblk);
        waitedMs += kRingWaitMs;
        if (waitedMs >= kRingTimeoutMs) {
            ALOGE("acquireBuffer: totalWaitTime exceeds, TIME_OUT");
            return STATUS_TIMEOUT;
        }
        if (seen != write) {
            write = seen;
            return STATUS_NO_ERROR;
        }
    }
}

void TouchCompanionClient::releaseBuffer(FrameBuffer* buffer) {
    if (buffer->frameCount == 0 || mCblk == nullptr) {
        return;
    }
    const uint32_t read = mCblk->read + buffer->frameCount;
    const uint32_t bufferFrames = mCblk->bufferFrames;
    if (bufferFrames == 0 ? read == 0 : read % bufferFrames == 0) {
        mCblk->readWrap += 1;
    }
    TouchCompanionSharedCblk::publishIndex(mCblk->read, read);
    ALOGD("releaseBuffer: read = %u, readWrap = %u", read, mCblk->readWrap);
}

// ---- delivery ----

void TouchCompanionClient::processData() {
    if (mCblk == nullptr) {
        return;
    }
    FrameBuffer buffer = {nullptr, mCblk->frameSize, 0};
    ALOGD("processData: acquire buffer");
    int status = acquireBuffer(&buffer);
    if (status != STATUS_NO_ERROR) {
        ALOGE("processData: buffer is not acquired(error = %d)", status);
        ALOGD("processData: finished");
        return;
    }
    const uint32_t length = frameLength(buffer.data);
    ALOGD("processData: buffer is acquired(buffer size = %zu, packet size = %u", buffer.size,
          length);
    if (mCallback != nullptr) {
        mCallback(0, buffer.data, length, mContext);
    }
    countFrame();
    releaseBuffer(&buffer);
    ALOGD("processData: finished");
}

// The length that a frame tells of itself; 0 where that would lie outside the shared memory, as
// with a ring of no frames.
uint32_t TouchCompanionClient::frameLength(const void* frame) const {
    const uintptr_t start = reinterpret_cast<uintptr_t>(mCblk);
    const uintptr_t position = reinterpret_cast<uintptr_t>(frame) - start;
    uint32_t length = 0;
    const size_t size = mCblkMemory->size();
    if (position <= size && size - position >= kFrameLengthOffset + sizeof(length)) {
        memcpy(&length, static_cast<const uint8_t*>(frame) + kFrameLengthOffset, sizeof(length));
    }
    return length;
}

// The rate is logged once a second, and only while every second is reached in turn.
void TouchCompanionClient::countFrame() {
    const int64_t now = systemTime(SYSTEM_TIME_MONOTONIC);
    if (mFrameCount == 0) {
        mStartTime = now;
    }
    mFrameCount += 1;
    const uint32_t second = static_cast<uint32_t>((now - mStartTime) / kNanosPerSecond);
    if (second == mLastSecond + 1) {
        mLastSecond = second;
        ALOGD("frameRate = %u, total = %u, sec = %u", mFrameCount / second, mFrameCount, second);
    }
}

}  // namespace pemaro
