// SPDX-License-Identifier: Apache-2.0
#include "simulator/managers/GestureManagerSimulator.h"

#include <optional>
#include <utility>

namespace pemaro::simulator {
namespace {

using Sample = IGestureManagerClient::GestureData;

constexpr int kNone = -1;
constexpr uint32_t kTicksPerWakeup = 4;

std::optional<Stroke> readSample(const Sample& sample) {
    const auto record = readGestureRecord(sample.bytes);
    if (record == nullptr || !isDrawn(strokeOf(*record))) {
        return std::nullopt;
    }
    return strokeOf(*record);
}

}  // namespace

GestureManagerSimulator::GestureManagerSimulator(const ManagerOptions& options)
        : GestureManagerBase(ServiceKind::kGesture, options) {
    for (int shape = 1; shape <= kShapes; ++shape) {
        mGestures[shape] = {};
    }
    startTicking(options.gestureRate, this);
}

GestureManagerSimulator::~GestureManagerSimulator() {
    shutDown();
}

void GestureManagerSimulator::tick() {
    std::lock_guard<std::mutex> guard(lock());
    const bool wakes = !mDetection && mWakeup && mTicks++ % kTicksPerWakeup == 0;
    if (!mDetection && !wakes) {
        return;
    }
    int number = kNone;
    const Stroke stroke = drawNext(&number);
    if (number == kNone) {
        return;
    }
    auto record = std::make_shared<GestureRecord>();
    setStroke(stroke, record.get());
    record->sequence = mSequence++;
    record->gesture = number;
    record->flags = wakes ? kGestureWakeup : 0;
    sealGestureRecord(record.get());
    publish<GestureRecord>(record);
}

Stroke GestureManagerSimulator::drawNext(int* number) const {
    std::vector<int> enabled;
    for (const auto& [candidate, gesture] : mGestures) {
        if (gesture.enabled) {
            enabled.push_back(candidate);
        }
    }
    if (enabled.empty()) {
        return {};
    }
    *number = enabled[mSequence % enabled.size()];
    const std::vector<Stroke>& samples = mGestures.at(*number).samples;
    return samples.empty() ? drawShape(*number, mSequence)
                           : drawAgain(samples[mSequence % samples.size()], mSequence);
}

// ---- settings ----

int GestureManagerSimulator::enableWakeup() {
    return change("enableWakeup", &mWakeup, true, "wake-up");
}

int GestureManagerSimulator::disableWakeup() {
    return change("disableWakeup", &mWakeup, false, "wake-up");
}

int GestureManagerSimulator::startGestureDetection() {
    return change("startGestureDetection", &mDetection, true, "detection");
}

int GestureManagerSimulator::stopGestureDetection() {
    return change("stopGestureDetection", &mDetection, false, "detection");
}

int GestureManagerSimulator::change(const char* operation, bool* setting, bool on,
                                    const char* what) {
    return perform(operation, [&] {
        *setting = on;
        mTicks = 0;
        narrate(std::string(what) + (on ? " on" : " off"));
        return STATUS_NO_ERROR;
    });
}

// ---- gestures ----

int GestureManagerSimulator::addGesture(int count, Sample* samples, int& result) {
    result = kNone;
    return perform("addGesture", [&] {
        if (count < 1) {
            return STATUS_BAD_PARAMETER;
        }
        if (samples == nullptr) {
            return STATUS_NULL_POINTER;
        }
        std::vector<Stroke> strokes;
        for (int i = 0; i < count; ++i) {
            auto stroke = readSample(samples[i]);
            if (!stroke) {
                return STATUS_INVALID_FORMAT;
            }
            strokes.push_back(std::move(*stroke));
        }
        return store(std::move(strokes), &result);
    });
}

int GestureManagerSimulator::store(std::vector<Stroke> samples, int* number) {
    if (mGestures.size() >= kShapes + options().userGestures) {
        return STATUS_ERROR_ACQUIRING_RESOURCE;
    }
    *number = kFirstUserGesture;
    while (mGestures.count(*number) != 0) {
        *number += 1;
    }
    narrate("gesture " + std::to_string(*number) + " defined by " + std::to_string(samples.size()) +
            " samples");
    mGestures[*number].samples = std::move(samples);
    return STATUS_NO_ERROR;
}

int GestureManagerSimulator::deleteGesture(int gesture) {
    return perform("deleteGesture", [&] {
        if (mGestures.count(gesture) == 0) {
            return STATUS_NOT_FOUND;
        }
        if (gesture < kFirstUserGesture) {
            return STATUS_UNSUPPORTED;
        }
        mGestures.erase(gesture);
        narrate("gesture " + std::to_string(gesture) + " deleted");
        return STATUS_NO_ERROR;
    });
}

int GestureManagerSimulator::enableGesture(int gesture) {
    return changeGesture("enableGesture", gesture, true);
}

int GestureManagerSimulator::disableGesture(int gesture) {
    return changeGesture("disableGesture", gesture, false);
}

int GestureManagerSimulator::changeGesture(const char* operation, int gesture, bool enabled) {
    return perform(operation, [&] {
        const auto found = mGestures.find(gesture);
        if (found == mGestures.end()) {
            return STATUS_NOT_FOUND;
        }
        found->second.enabled = enabled;
        return STATUS_NO_ERROR;
    });
}

int GestureManagerSimulator::improveGestureTraining(Sample* sample, int& result) {
    result = kNone;
    return perform("improveGestureTraining", [&] {
        if (sample == nullptr) {
            return STATUS_NULL_POINTER;
        }
        const auto stroke = readSample(*sample);
        if (!stroke) {
            return STATUS_INVALID_FORMAT;
        }
        result = mostSimilar(*stroke);
        return result == kNone ? STATUS_NOT_FOUND : STATUS_NO_ERROR;
    });
}

int GestureManagerSimulator::mostSimilar(const Stroke& stroke) const {
    int best = kNone;
    double similarity = 0;
    for (const auto& [number, gesture] : mGestures) {
        for (const Stroke& sample : gesture.samples) {
            const double similar = strokeSimilarity(stroke, sample);
            if (gesture.enabled && similar >= kSimilarEnough && similar > similarity) {
                best = number;
                similarity = similar;
            }
        }
    }
    return best;
}

int GestureManagerSimulator::getMaxPreDefinedGesture(unsigned int& count) {
    count = 0;
    return perform("getMaxPreDefinedGesture", [&] {
        count = kShapes;
        return STATUS_NO_ERROR;
    });
}

int GestureManagerSimulator::getMaxUserDefinedGesture(unsigned int& count) {
    count = 0;
    return perform("getMaxUserDefinedGesture", [&] {
        count = options().userGestures;
        return STATUS_NO_ERROR;
    });
}

std::vector<std::string> GestureManagerSimulator::gestures() {
    std::lock_guard<std::mutex> guard(lock());
    std::vector<std::string> lines;
    for (const auto& [number, gesture] : mGestures) {
        lines.push_back(std::to_string(number) + (gesture.enabled ? " enabled " : " disabled ") +
                        std::to_string(gesture.samples.size()));
    }
    return lines;
}

std::vector<std::string> GestureManagerSimulator::state() {
    std::lock_guard<std::mutex> guard(lock());
    return {std::string("detection=") + (mDetection ? "on" : "off"),
            std::string("wakeup=") + (mWakeup ? "on" : "off")};
}

}  // namespace pemaro::simulator
