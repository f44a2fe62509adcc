// SPDX-License-Identifier: Apache-2.0
#define LOG_TAG "TouchCompanionClient"

#include "companion/FrameDelivery.h"

#include <log/log.h>
#include <utils/Timers.h>

#include <cstring>

#include "pemaro/Status.h"

namespace pemaro {

namespace {

// The rate is logged once a second, and only while every second is reached in turn.
void countFrame(FrameStatistics& statistics) {
    const int64_t now = systemTime(SYSTEM_TIME_MONOTONIC);
    if (statistics.frames == 0) {
        statistics.startTime = now;
    }
    statistics.frames += 1;
    const uint32_t second = static_cast<uint32_t>(ns2s(now - statistics.startTime));
    if (second != 0 && second == statistics.lastSecond + 1) {
        statistics.lastSecond = second;
        ALOGD("frameRate = %u, total = %u, sec = %u", statistics.frames / second, statistics.frames,
              second);
    }
}

}  // namespace

FrameDelivery::FrameDelivery(const MappedBlock& block, DataCallback callback, void* context,
                             WaitWatch* watch)
        : mReader(block, watch), mCallback(callback), mContext(context) {}

void FrameDelivery::pass(FrameStatistics& statistics) {
    const RingFields fields = mReader.fields();
    RingReader::FrameBuffer buffer = {nullptr, fields.frameSize, 0};
    ALOGD("processData: acquire buffer");
    int status = mReader.acquire(fields, &buffer);
    if (status == RingReader::kUnwanted) {
        return;
    }
    if (status != STATUS_NO_ERROR) {
        ALOGE("processData: buffer is not acquired(error = %d)", status);
        ALOGD("processData: finished");
        return;
    }
    // The callback cannot tell what is mapped: a frame that does not lie there becomes one of no
    // length. Any other has the length that it tells of itself.
    void* frame = mReader.block().cblk->frames();
    uint32_t length = 0;
    if (mReader.holds(buffer.data, fields.frameSize)) {
        frame = buffer.data;
        memcpy(&length, static_cast<const uint8_t*>(frame) + kFrameLengthOffset, sizeof(length));
    }
    ALOGD("processData: buffer is acquired(buffer size = %zu, packet size = %u", buffer.size,
          length);
    if (mCallback != nullptr) {
        mCallback(0, frame, length, mContext);
    }
    countFrame(statistics);
    mReader.release(fields, buffer);
    ALOGD("processData: finished");
}

}  // namespace pemaro
