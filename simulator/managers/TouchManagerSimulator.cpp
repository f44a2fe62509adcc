// SPDX-License-Identifier: Apache-2.0
#include "simulator/managers/TouchManagerSimulator.h"

#include <algorithm>
#include <vector>

#include "simulator/managers/Stroke.h"

namespace pemaro::simulator {
namespace {

struct Feature {
    int number;
    int firstShape;
    int lastShape;
};

constexpr Feature kFeatures[] = {{1, 1, 4}, {2, 5, 5}, {3, 6, 7}, {4, 8, 8}};

bool hasFeature(int number) {
    return std::any_of(std::begin(kFeatures), std::end(kFeatures),
                       [number](const Feature& feature) { return feature.number == number; });
}

struct Candidate {
    int feature;
    int shape;
};

std::vector<Candidate> candidates(const std::set<int>& enabled) {
    std::vector<Candidate> result;
    for (const Feature& feature : kFeatures) {
        for (int shape = feature.firstShape; shape <= feature.lastShape; ++shape) {
            if (enabled.count(feature.number) != 0) {
                result.push_back({feature.number, shape});
            }
        }
    }
    return result;
}

}  // namespace

TouchManagerSimulator::TouchManagerSimulator(const ManagerOptions& options)
        : TouchManagerBase(ServiceKind::kTouch, options) {
    startTicking(options.gestureRate, this);
}

TouchManagerSimulator::~TouchManagerSimulator() {
    shutDown();
}

void TouchManagerSimulator::tick() {
    std::lock_guard<std::mutex> guard(lock());
    const std::vector<Candidate> choice = candidates(mEnabled);
    if (choice.empty()) {
        return;
    }
    const Candidate& next = choice[mSequence % choice.size()];
    auto record = std::make_shared<GestureRecord>();
    setStroke(drawShape(next.shape, mSequence), record.get());
    record->sequence = mSequence++;
    record->gesture = next.shape;
    record->feature = next.feature;
    record->flags = regionFlags(*record);
    sealGestureRecord(record.get());
    publish<GestureRecord>(record);
}

uint32_t TouchManagerSimulator::regionFlags(const GestureRecord& record) const {
    if (!mRegion) {
        return 0;
    }
    long x = 0;
    long y = 0;
    for (const GesturePoint& point : strokeOf(record)) {
        x += point.x;
        y += point.y;
    }
    const long count = record.pointCount;
    const bool inside = x >= mRegion->left * count && x < mRegion->right * count &&
                        y >= mRegion->top * count && y < mRegion->bottom * count;
    return kGestureRegionOn | (inside ? kGestureInsideRegion : 0);
}

int TouchManagerSimulator::isSupported(int feature, bool& supported) {
    supported = false;
    return perform("isSupported", [&] {
        supported = hasFeature(feature);
        return STATUS_NO_ERROR;
    });
}

int TouchManagerSimulator::isEnabled(int feature, bool& enabled) {
    enabled = false;
    return perform("isEnabled", [&] {
        enabled = mEnabled.count(feature) != 0;
        return STATUS_NO_ERROR;
    });
}

int TouchManagerSimulator::enable(int feature) {
    return change("enable", feature, true);
}

int TouchManagerSimulator::disable(int feature) {
    return change("disable", feature, false);
}

int TouchManagerSimulator::change(const char* operation, int feature, bool on) {
    return perform(operation, [&] {
        if (!hasFeature(feature)) {
            return STATUS_UNSUPPORTED;
        }
        if (on) {
            mEnabled.insert(feature);
        } else {
            mEnabled.erase(feature);
        }
        narrate("feature " + std::to_string(feature) + (on ? " enabled" : " disabled"));
        return STATUS_NO_ERROR;
    });
}

int TouchManagerSimulator::configure_vm_region(android::Rect& region, bool flag) {
    return perform("configure_vm_region", [&] {
        if (region.left >= region.right || region.top >= region.bottom) {
            return STATUS_BAD_PARAMETER;
        }
        mRegion = flag ? std::optional(region) : std::nullopt;
        narrate("region " + std::to_string(region.left) + "," + std::to_string(region.top) +
                " to " + std::to_string(region.right) + "," + std::to_string(region.bottom) +
                (flag ? " on" : " off"));
        return STATUS_NO_ERROR;
    });
}

}  // namespace pemaro::simulator
