// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/services/FrameStream.h"

#include "frames/Frame.h"
#include "pemaro/Status.h"
#include "tools/zelkctl/terminal/Report.h"
#include "tools/zelkctl/terminal/Supervisor.h"

namespace pemaro::zelkctl {
namespace {

constexpr int kOutputMemory = 1;

}  // namespace

int preparePackets(ITouchCompanionFacade& facade, FrameReceiver& receiver) {
    const int packetSize = call("getPacketSize", [&] { return facade.getPacketSize(); });
    if (packetSize >= STATUS_UNKNOWN_ERROR) {
        return failStatus("getPacketSize", packetSize);
    }
    if (packetSize <= 0) {
        return fail(fmt::format("the service tells a packet size of {} bytes", packetSize));
    }
    receiver.setPacketSize(static_cast<uint32_t>(packetSize));
    return tools::kExitSuccess;
}

int startStream(ITouchCompanionFacade& facade) {
    int status = call("setRecordOutput", [&] { return facade.setRecordOutput(kOutputMemory); });
    if (status != STATUS_NO_ERROR) {
        return failStatus("setRecordOutput", status);
    }
    status = call("startRecord", [&] { return facade.startRecord(); });
    if (status != STATUS_NO_ERROR) {
        // The recording thread may be at work already.
        call("stopRecord", [&] { return facade.stopRecord(); });
        return failStatus("startRecord", status);
    }
    return tools::kExitSuccess;
}

void LatestFrame::onFrame(int type, void* frame, unsigned long length, void* context) {
    auto* latest = static_cast<LatestFrame*>(context);
    const uint64_t before = latest->mReceiver.stats().frames;
    FrameReceiver::onFrame(type, frame, length, &latest->mReceiver);
    // What the receiver did not believe is not looked at.
    if (latest->mReceiver.stats().frames != before) {
        latest->keep(frame, length);
    }
}

void LatestFrame::keep(const void* frame, size_t length) {
    if (frames::frameFault(frame, length) != nullptr) {
        return;
    }
    const auto* bytes = static_cast<const uint8_t*>(frame);
    std::lock_guard<std::mutex> guard(mLock);
    mFrame.assign(bytes, bytes + length);
    mIsNew = true;
}

bool LatestFrame::take(std::vector<uint8_t>* frame) {
    std::lock_guard<std::mutex> guard(mLock);
    if (!mIsNew) {
        return false;
    }
    *frame = mFrame;
    mIsNew = false;
    return true;
}

}  // namespace pemaro::zelkctl
