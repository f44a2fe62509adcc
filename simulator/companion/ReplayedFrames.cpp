// SPDX-License-Identifier: Apache-2.0
#include "simulator/companion/ReplayedFrames.h"

#include <algorithm>
#include <utility>

namespace pemaro::simulator {
namespace {

using frames::RecordingFile;
using std::chrono::nanoseconds;

/// Between rounds of a recording whose frames have no distance in time.
constexpr nanoseconds kShortestPause = std::chrono::milliseconds(1);

}  // namespace

std::shared_ptr<const Replay> Replay::open(const std::string& path, std::string* problem,
                                           const RecordingFile::Progress& progress) {
    const auto file = RecordingFile::open(path, problem, progress);
    if (file == nullptr) {
        return nullptr;
    }
    std::shared_ptr<Replay> replay(new Replay);
    if (!replay->load(*file, progress)) {
        *problem = file->problem().empty() ? "cannot read " + path + ": that was given up"
                                           : file->problem();
        return nullptr;
    }
    if (replay->mFrames.empty()) {
        *problem = path + " has no frame that could be played";
        return nullptr;
    }
    return replay;
}

/// False when the file has not what it had, and when that is given up.
bool Replay::load(const RecordingFile& file, const RecordingFile::Progress& progress) {
    nanoseconds due{0};
    const RecordingFile::Part* before = nullptr;
    for (const RecordingFile::Part& part : file.parts()) {
        if (progress && !progress(part.offset, file.size())) {
            return false;
        }
        if (part.kind == RecordingFile::Kind::kTruncated || part.header.length != part.length) {
            mLeftOut += part.length;
            continue;
        }
        // The times of a corrupt frame are not believed; one that goes back is another recording's.
        if (part.kind == RecordingFile::Kind::kFrame) {
            if (before != nullptr) {
                const auto step = static_cast<int64_t>(part.header.timeNs - before->header.timeNs);
                due += nanoseconds(std::max<int64_t>(step, 0));
            }
            before = &part;
        }
        const uint8_t* bytes = file.bytes(part);
        if (bytes == nullptr) {
            return false;
        }
        mFrames.push_back({{bytes, bytes + part.length}, due});
        mLongest = std::max(mLongest, part.length);
    }
    return true;
}

ReplayedFrames::ReplayedFrames(std::shared_ptr<const Replay> replay, double speed, bool loop)
        : mReplay(std::move(replay)), mSpeed(speed), mLoop(loop) {}

std::optional<nanoseconds> ReplayedFrames::due() const {
    if (mNext == mReplay->frames()) {
        return std::nullopt;
    }
    const nanoseconds due = mRoundStart + mReplay->mFrames[mNext].due;
    return isPaced() ? nanoseconds(static_cast<int64_t>(static_cast<double>(due.count()) / mSpeed))
                     : due;
}

FrameSource::Frame ReplayedFrames::next(uint32_t, uint64_t, uint32_t) {
    const Replay::Entry& entry = mReplay->mFrames[mNext];
    mNext += 1;
    if (mNext == mReplay->frames() && mLoop) {
        const nanoseconds whole = mReplay->duration();
        const auto intervals = std::max<int64_t>(static_cast<int64_t>(mReplay->frames()) - 1, 1);
        mRoundStart += whole + std::max(whole / intervals, kShortestPause);
        mNext = 0;
    }
    return {entry.bytes.data(), entry.bytes.size()};
}

}  // namespace pemaro::simulator
