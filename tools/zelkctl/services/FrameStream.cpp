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

void LatestFrame::onFrame(int, void* frame, unsigned long length, void* context) {
    auto* latest = static_cast<LatestFrame*>(context);
    const std::vector<uint8_t>* copy = latest->mReceiver.take(frame, length);
    if (copy != nullptr) {
        latest->keep(*copy);
    }
}

/// The receiver has checked the frame, if it is of a kind that can be checked.
void LatestFrame::keep(const std::vector<uint8_t>& frame) {
    frames::FrameHeader header;
    if (!frames::readFrameHeader(frame.data(), frame.size(), &header)) {
        return;
    }
    std::lock_guard<std::mutex> guard(mLock);
    mFrame = frame;
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
