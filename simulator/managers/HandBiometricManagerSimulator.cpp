// SPDX-License-Identifier: Apache-2.0
#include "simulator/managers/HandBiometricManagerSimulator.h"

#include <algorithm>
#include <cstring>
#include <utility>

namespace pemaro::simulator {
namespace {

constexpr double kAskedSimilarity[] = {60, 75, 85, 95};
constexpr uint32_t kEnrollmentSteps = 5;
constexpr uint32_t kStepsPerWakeup = 10;
/// A person who is never enrolled.
constexpr uint32_t kStranger = 0xFFFFFFFE;

static_assert(std::size(kAskedSimilarity) == HandBiometricManagerSimulator::kMaxSecurity + 1,
              "one for each level");

}  // namespace

HandBiometricManagerSimulator::HandBiometricManagerSimulator(const ManagerOptions& options)
        : HandManagerBase(ServiceKind::kHand, options) {
    startTicking(options.handRate, this);
}

HandBiometricManagerSimulator::~HandBiometricManagerSimulator() {
    shutDown();
}

// ---- what goes on ----

void HandBiometricManagerSimulator::tick() {
    std::lock_guard<std::mutex> guard(lock());
    switch (mActivity) {
        case Activity::kEnrolling:
            stepEnrollment();
            break;
        case Activity::kScanning:
            stepScan();
            break;
        case Activity::kMatching:
            stepMatching();
            break;
        case Activity::kIdle:
            stepIdle();
            break;
    }
    mStep += 1;
}

void HandBiometricManagerSimulator::stepEnrollment() {
    if (mStep == 0) {
        report(newEvent(HandEvent::kEnrollmentStarted));
        return;
    }
    const HandImage image = seeHand(mPersons, kCarefulNoise, mSequence);
    if (mStep > kEnrollmentSteps) {
        enroll(image);
        return;
    }
    auto record = newEvent(HandEvent::kEnrollmentProgress);
    record->progress = 100 * mStep / kEnrollmentSteps;
    record->image = image;
    report(record);
}

void HandBiometricManagerSimulator::enroll(const HandImage& image) {
    uint32_t number = mPersons;
    std::string name;
    do {
        name = "hand " + std::to_string(++number);
    } while (find(name.c_str()) != mProfiles.end());
    mProfiles.push_back({mPersons++, name, image});
    mLastEnrolled = name;
    mActivity = Activity::kIdle;
    narrate(name + " enrolled");

    auto record = newEvent(HandEvent::kEnrollmentDone);
    record->progress = 100;
    record->image = image;
    strncpy(record->profile, name.c_str(), sizeof(record->profile) - 1);
    report(record);
}

void HandBiometricManagerSimulator::stepScan() {
    auto record = newEvent(mStep == 0 ? HandEvent::kScanStarted : HandEvent::kScanDone);
    if (mStep != 0) {
        record->image = seeHand(kStranger, kCarefulNoise, mSequence);
        mActivity = Activity::kIdle;
    }
    report(record);
}

void HandBiometricManagerSimulator::stepMatching() {
    if (mStep == 0) {
        report(newEvent(HandEvent::kMatchingStarted));
    } else if (mStep % 2 == 1) {
        mHand = nextHandToMatch();
        auto record = newEvent(HandEvent::kHandDetected);
        record->image = mHand;
        report(record);
    } else {
        judge(mHand);
    }
}

HandImage HandBiometricManagerSimulator::nextHandToMatch() {
    const size_t turn = mStep / 2 % (2 * mProfiles.size() + 1);
    const bool stranger = turn == 2 * mProfiles.size();
    return seeHand(stranger ? kStranger : mProfiles[turn / 2].person,
                   turn % 2 == 0 ? kCarefulNoise : kCarelessNoise, mSequence);
}

void HandBiometricManagerSimulator::judge(const HandImage& image) {
    const Profile* best = nullptr;
    double similarity = 0;
    for (const Profile& profile : mProfiles) {
        const double similar = handSimilarity(image, profile.image);
        if (best == nullptr || similar > similarity) {
            best = &profile;
            similarity = similar;
        }
    }
    const bool matched = best != nullptr && similarity >= kAskedSimilarity[mSecurity];
    auto record = newEvent(matched ? HandEvent::kMatched : HandEvent::kNotMatched);
    record->score = static_cast<uint32_t>(similarity);
    record->image = image;
    if (matched) {
        strncpy(record->profile, best->name.c_str(), sizeof(record->profile) - 1);
    }
    report(record);
}

void HandBiometricManagerSimulator::stepIdle() {
    if (mWakeup && mStep % kStepsPerWakeup == kStepsPerWakeup - 1) {
        report(newEvent(HandEvent::kWakeup));
    }
}

std::shared_ptr<HandRecord> HandBiometricManagerSimulator::newEvent(HandEvent event) {
    auto record = std::make_shared<HandRecord>();
    record->event = event;
    return record;
}

void HandBiometricManagerSimulator::report(std::shared_ptr<HandRecord> record) {
    record->sequence = mSequence++;
    record->security = mSecurity;
    sealHandRecord(record.get());
    publish<HandRecord>(std::move(record));
}

int HandBiometricManagerSimulator::startEnrollment() {
    return begin("startEnrollment", Activity::kEnrolling);
}

int HandBiometricManagerSimulator::stopEnrollment() {
    return end("stopEnrollment", Activity::kEnrolling, HandEvent::kEnrollmentStopped);
}

int HandBiometricManagerSimulator::scan() {
    return begin("scan", Activity::kScanning);
}

int HandBiometricManagerSimulator::startMatching() {
    return begin("startMatching", Activity::kMatching);
}

int HandBiometricManagerSimulator::stopMatching() {
    return end("stopMatching", Activity::kMatching, HandEvent::kMatchingStopped);
}

int HandBiometricManagerSimulator::begin(const char* operation, Activity activity) {
    return perform(operation, [&] {
        if (mActivity != Activity::kIdle) {
            return STATUS_INVALID_STATE;
        }
        if (activity == Activity::kEnrolling && mProfiles.size() >= options().handProfiles) {
            return STATUS_ERROR_ACQUIRING_RESOURCE;
        }
        mActivity = activity;
        mStep = 0;
        narrate(operation);
        return STATUS_NO_ERROR;
    });
}

int HandBiometricManagerSimulator::end(const char* operation, Activity activity, HandEvent event) {
    return perform(operation, [&] {
        return mActivity == activity ? finish(operation, event) : STATUS_INVALID_STATE;
    });
}

int HandBiometricManagerSimulator::cancelScan() {
    return perform("cancelScan", [&] {
        return mActivity == Activity::kIdle ? STATUS_INVALID_STATE
                                            : finish("cancelScan", HandEvent::kCancelled);
    });
}

int HandBiometricManagerSimulator::finish(const char* operation, HandEvent event) {
    mActivity = Activity::kIdle;
    mStep = 0;
    narrate(operation);
    report(newEvent(event));
    return STATUS_NO_ERROR;
}

// ---- settings ----

int HandBiometricManagerSimulator::setSecurity(int level) {
    return perform("setSecurity", [&] {
        if (level < 0 || level > kMaxSecurity) {
            return STATUS_BAD_PARAMETER;
        }
        mSecurity = level;
        narrate("security level " + std::to_string(level));
        return STATUS_NO_ERROR;
    });
}

int HandBiometricManagerSimulator::enableWakeup() {
    return changeWakeup("enableWakeup", true);
}

int HandBiometricManagerSimulator::disableWakeup() {
    return changeWakeup("disableWakeup", false);
}

int HandBiometricManagerSimulator::changeWakeup(const char* operation, bool on) {
    return perform(operation, [&] {
        mWakeup = on;
        narrate(on ? "wake-up on" : "wake-up off");
        return STATUS_NO_ERROR;
    });
}

// ---- profiles ----

int HandBiometricManagerSimulator::setProfileName(const char* name) {
    return perform("setProfileName", [&] {
        const auto profile = find(mLastEnrolled.c_str());
        return profile == mProfiles.end() ? STATUS_INVALID_STATE : rename(profile, name);
    });
}

int HandBiometricManagerSimulator::renameProfile(const char* first, const char* second) {
    return perform("renameProfile", [&] {
        if (first == nullptr) {
            return STATUS_NULL_POINTER;
        }
        const auto profile = find(first);
        return profile == mProfiles.end() ? STATUS_NOT_FOUND : rename(profile, second);
    });
}

int HandBiometricManagerSimulator::rename(Profiles::iterator profile, const char* name) {
    if (name == nullptr) {
        return STATUS_NULL_POINTER;
    }
    if (*name == '\0' || strlen(name) >= sizeof(HandRecord::profile)) {
        return STATUS_BAD_PARAMETER;
    }
    const auto holder = find(name);
    if (holder != mProfiles.end() && holder != profile) {
        return STATUS_INVALID_ARGUMENTS;
    }
    if (profile->name == mLastEnrolled) {
        mLastEnrolled = name;
    }
    narrate(profile->name + " is now " + name);
    profile->name = name;
    return STATUS_NO_ERROR;
}

int HandBiometricManagerSimulator::deleteProfile(const char* name) {
    return perform("deleteProfile", [&] {
        if (name == nullptr) {
            return STATUS_NULL_POINTER;
        }
        const auto profile = find(name);
        if (profile == mProfiles.end()) {
            return STATUS_NOT_FOUND;
        }
        narrate(profile->name + " deleted");
        mProfiles.erase(profile);
        return STATUS_NO_ERROR;
    });
}

HandBiometricManagerSimulator::Profiles::iterator HandBiometricManagerSimulator::find(
        const char* name) {
    return std::find_if(mProfiles.begin(), mProfiles.end(),
                        [name](const Profile& profile) { return profile.name == name; });
}

int HandBiometricManagerSimulator::getMaxUser(unsigned int& count) {
    count = 0;
    return perform("getMaxUser", [&] {
        count = options().handProfiles;
        return STATUS_NO_ERROR;
    });
}

int HandBiometricManagerSimulator::getProfileList(std::vector<std::string>& names) {
    return perform("getProfileList", [&] {
        for (const Profile& profile : mProfiles) {
            names.push_back(profile.name);
        }
        return STATUS_NO_ERROR;
    });
}

std::vector<std::string> HandBiometricManagerSimulator::state() {
    static constexpr const char* kNames[] = {"idle", "enrolling", "scanning", "matching"};
    std::lock_guard<std::mutex> guard(lock());
    return {std::string("activity=") + kNames[static_cast<int>(mActivity)],
            std::string("wakeup=") + (mWakeup ? "on" : "off"),
            "security=" + std::to_string(mSecurity)};
}

}  // namespace pemaro::simulator
