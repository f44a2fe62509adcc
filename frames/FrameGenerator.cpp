// SPDX-License-Identifier: Apache-2.0
#include "frames/FrameGenerator.h"

#include <algorithm>
#include <cmath>
#include <cstring>

namespace pemaro::frames {
namespace {

/// What the header has room to tell: of columns, of rows, and of fingers.
constexpr uint32_t kMaxCount = 65535;
/// A finger touches this many cells to each side of its centre.
constexpr uint32_t kReach = 3;
constexpr float kSigma = 1.3f;

FingerRecord fingerAt(uint32_t id, double seconds) {
    const double x = std::sin(2 * M_PI * (0.31 + 0.07 * id) * seconds + id);
    const double y = std::sin(2 * M_PI * (0.23 + 0.05 * id) * seconds + 2 * id);
    FingerRecord finger{};
    finger.id = static_cast<uint16_t>(id);
    finger.x = static_cast<uint16_t>((0.5 + 0.45 * x) * kPositionMax);
    finger.y = static_cast<uint16_t>((0.5 + 0.45 * y) * kPositionMax);
    finger.peak = static_cast<int16_t>(kFingerPeak - 60 * (id % 8));
    return finger;
}

}  // namespace

FrameGenerator::FrameGenerator(uint32_t frameBytes, uint32_t fingers) {
    const uint32_t room = frameBytes - static_cast<uint32_t>(sizeof(FrameHeader));
    mFingers = std::min({fingers, kMaxCount, room / static_cast<uint32_t>(sizeof(FingerRecord))});
    const uint32_t cells = (room - mFingers * sizeof(FingerRecord)) / sizeof(int16_t);
    // Panels are taller than wide: about 9 columns for 16 rows.
    mColumns = static_cast<uint32_t>(std::sqrt(cells * 9.0 / 16.0));
    mColumns = std::clamp(mColumns, std::min(cells, 1u), kMaxCount);
    mRows = mColumns == 0 ? 0 : std::min(cells / mColumns, kMaxCount);
}

const std::vector<uint8_t>& FrameGenerator::draw(uint32_t sequence, uint64_t timeNs,
                                                 uint32_t filter) {
    mMoving.clear();
    for (uint32_t id = 0; id < mFingers; ++id) {
        mMoving.push_back(fingerAt(id, static_cast<double>(timeNs) / 1e9));
    }
    return draw(sequence, timeNs, filter, mMoving);
}

const std::vector<uint8_t>& FrameGenerator::draw(uint32_t sequence, uint64_t timeNs,
                                                 uint32_t filter,
                                                 const std::vector<FingerRecord>& fingers) {
    const size_t shown = std::min<size_t>(fingers.size(), mFingers);
    FrameHeader header{};
    header.magic = kFrameMagic;
    header.version = kFrameVersion;
    header.headerBytes = sizeof(header);
    header.sequence = sequence;
    header.timeNs = timeNs;
    header.filter = filter;
    header.fingers = static_cast<uint16_t>((filter & kFilterFingers) != 0 ? shown : 0);
    header.columns = static_cast<uint16_t>((filter & kFilterImage) != 0 ? mColumns : 0);
    header.rows = static_cast<uint16_t>((filter & kFilterImage) != 0 ? mRows : 0);
    const size_t image = sizeof(header) + header.fingers * sizeof(FingerRecord);
    header.length = static_cast<uint32_t>(image + sizeof(int16_t) * header.columns * header.rows);

    mFrame.assign(header.length, 0);
    for (size_t i = 0; i < shown; ++i) {
        if (header.fingers != 0) {
            memcpy(&mFrame[sizeof(header) + i * sizeof(FingerRecord)], &fingers[i],
                   sizeof(FingerRecord));
        }
        if (header.rows != 0) {
            drawFinger(fingers[i], &mFrame[image]);
        }
    }
    memcpy(mFrame.data(), &header, sizeof(header));
    header.checksum = frameChecksum(mFrame.data(), mFrame.size());
    memcpy(mFrame.data(), &header, sizeof(header));
    return mFrame;
}

void FrameGenerator::drawFinger(const FingerRecord& finger, uint8_t* image) const {
    const Axis across = bell(finger.x, mColumns);
    const Axis down = bell(finger.y, mRows);
    for (size_t row = 0; row < down.weights.size(); ++row) {
        for (size_t column = 0; column < across.weights.size(); ++column) {
            const size_t cell = (down.first + row) * mColumns + across.first + column;
            int16_t value;
            memcpy(&value, image + cell * sizeof(value), sizeof(value));
            const float add =
                    static_cast<float>(finger.peak) * down.weights[row] * across.weights[column];
            value = static_cast<int16_t>(std::min(static_cast<float>(value) + add, 32767.0f));
            memcpy(image + cell * sizeof(value), &value, sizeof(value));
        }
    }
}

FrameGenerator::Axis FrameGenerator::bell(uint32_t position, uint32_t cells) {
    const float centre =
            static_cast<float>(position) * static_cast<float>(cells - 1) / kPositionMax;
    const auto nearest = static_cast<uint32_t>(std::lround(centre));
    Axis axis;
    axis.first = nearest > kReach ? nearest - kReach : 0;
    const uint32_t end = std::min(nearest + kReach + 1, cells);
    for (uint32_t cell = axis.first; cell < end; ++cell) {
        const float distance = (static_cast<float>(cell) - centre) / kSigma;
        axis.weights.push_back(std::exp(-0.5f * distance * distance));
    }
    return axis;
}

}  // namespace pemaro::frames
