// SPDX-License-Identifier: Apache-2.0
#include "simulator/TouchStack.h"

#include <binder/IServiceManager.h>
#include <utils/String16.h>

#include <cstring>

namespace pemaro::simulator {
namespace {

template <typename Simulator>
void shutDownIfServed(const android::sp<Simulator>& service) {
    if (service != nullptr) {
        service->shutDown();
    }
}

template <typename Simulator>
void orderIfServed(const android::sp<Simulator>& service, const Fault& fault) {
    if (service != nullptr) {
        service->faults().add(fault);
    }
}

template <typename Simulator>
void summarize(const char* name, const android::sp<Simulator>& manager,
               std::vector<std::string>& lines) {
    if (manager == nullptr) {
        return;
    }
    const SubscriberList::Counts counts = manager->counts();
    lines.push_back(std::string(name) + ": " + std::to_string(counts.published) + " events, " +
                    std::to_string(counts.delivered) + " delivered, " +
                    std::to_string(counts.failed) + " failed, " + std::to_string(counts.dropped) +
                    " dropped");
}

}  // namespace

TouchStack::TouchStack(const Options& options) {
    const auto has = [&options](ServiceKind service) { return options.services.count(service); };
    if (has(ServiceKind::kTouch)) {
        mTouch = new TouchManagerSimulator(options.managers);
    }
    if (has(ServiceKind::kGesture)) {
        mGesture = new GestureManagerSimulator(options.managers);
    }
    if (has(ServiceKind::kHand)) {
        mHand = new HandBiometricManagerSimulator(options.managers);
    }
    if (has(ServiceKind::kCompanion)) {
        SimulatorOptions companion = options.companion;
        if (mGesture != nullptr) {
            companion.states["gestures"] = [gesture = mGesture] { return gesture->gestures(); };
            companion.states["gesturestate"] = [gesture = mGesture] { return gesture->state(); };
        }
        if (mHand != nullptr) {
            companion.states["handstate"] = [hand = mHand] { return hand->state(); };
        }
        mCompanion = new TouchCompanionSimulator(companion);
    }
}

TouchStack::~TouchStack() {
    shutDown();
}

void TouchStack::order(const Fault& fault) {
    switch (fault.service) {
        case ServiceKind::kCompanion:
            orderIfServed(mCompanion, fault);
            break;
        case ServiceKind::kTouch:
            orderIfServed(mTouch, fault);
            break;
        case ServiceKind::kGesture:
            orderIfServed(mGesture, fault);
            break;
        case ServiceKind::kHand:
            orderIfServed(mHand, fault);
            break;
    }
}

std::string TouchStack::registerAll() {
    const auto manager = android::defaultServiceManager();
    for (const auto& [name, binder] : services()) {
        const android::status_t status =
                manager->addService(android::String16(name.c_str()), binder);
        if (status != android::OK) {
            return "the service manager refused " + name + ": " + strerror(-status);
        }
    }
    return "";
}

std::vector<std::pair<std::string, android::sp<android::IBinder>>> TouchStack::services() const {
    std::vector<std::pair<std::string, android::sp<android::IBinder>>> services;
    for (const ServiceKind service : kServiceKinds) {
        const android::sp<android::IBinder> binder = binderOf(service);
        if (binder != nullptr) {
            services.emplace_back(registeredName(service), binder);
        }
    }
    return services;
}

android::sp<android::IBinder> TouchStack::binderOf(ServiceKind service) const {
    switch (service) {
        case ServiceKind::kTouch:
            return mTouch;
        case ServiceKind::kGesture:
            return mGesture;
        case ServiceKind::kHand:
            return mHand;
        case ServiceKind::kCompanion:
            break;
    }
    return mCompanion;
}

void TouchStack::shutDown() {
    shutDownIfServed(mCompanion);
    shutDownIfServed(mTouch);
    shutDownIfServed(mGesture);
    shutDownIfServed(mHand);
}

std::vector<std::string> TouchStack::summary() {
    std::vector<std::string> lines;
    if (mCompanion != nullptr) {
        const TouchCompanionSimulator::Totals totals = mCompanion->totals();
        lines.push_back("stopped: " + std::to_string(totals.recordings) + " recordings, " +
                        std::to_string(totals.produced) + " frames, " +
                        std::to_string(totals.dropped) + " without room in the ring");
    }
    summarize("touch", mTouch, lines);
    summarize("gesture", mGesture, lines);
    summarize("hand", mHand, lines);
    return lines;
}

}  // namespace pemaro::simulator
