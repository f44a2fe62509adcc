// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstdint>
#include <memory>
#include <string>
#include <vector>

#include "pemaro/BnHandBiometricManagerService.h"
#include "simulator/managers/HandRecord.h"
#include "simulator/managers/ManagerSimulator.h"

namespace pemaro::simulator {

using HandManagerBase = ManagerSimulator<BnHandBiometricManagerService, IHandBiometricManagerClient,
                                         IHandBiometricManagerClient::HandBioData,
                                         &IHandBiometricManagerClient::handBiometricCallback>;

/// A hand biometric manager. It does one thing at a time, an enrollment, a scan or a matching, in
/// steps of its own clock, and reports them in the order that HandRecord.h tells.
///
/// Each enrollment is of another person, whose profile is called "hand N" until setProfileName()
/// gives the one enrolled last another name; renameProfile() takes the current name first. Names are
/// of 1 to 47 bytes, and one is no other's.
///
/// While matching goes on, each enrolled hand is laid on the panel twice, first with care and then
/// carelessly, and after all of them a stranger's. A hand matches the most similar profile if they
/// are as alike as the security level asks: 60, 75, 85 or 95 of 100 at the levels 0 to 3. The level
/// is 1 at first. Careful hands pass every level, careless ones the first two, strangers none.
///
/// Statuses: 0x4000000B for what makes no sense now (something is going on already, or nothing is),
/// 0x4000000A when no further hand can be enrolled, 0x4000000D for a level or a name that is none,
/// 0x4000001B for a null name, 0x40000018 for a name that is taken, 0x40000019 for one that is not
/// there. Any thread may call.
class HandBiometricManagerSimulator : public HandManagerBase {
  public:
    static constexpr int kMaxSecurity = 3;

    explicit HandBiometricManagerSimulator(const ManagerOptions& options);

    /// One step of what is going on. Its own clock calls this.
    void tick();

    /// What goes on, wake-up and security level, as in "activity=idle".
    std::vector<std::string> state();

    int startEnrollment() override;
    int stopEnrollment() override;
    int scan() override;
    int startMatching() override;
    int stopMatching() override;
    int cancelScan() override;
    int setSecurity(int level) override;
    int setProfileName(const char* name) override;
    int deleteProfile(const char* name) override;
    int renameProfile(const char* first, const char* second) override;
    int getMaxUser(unsigned int& count) override;
    int getProfileList(std::vector<std::string>& names) override;
    int enableWakeup() override;
    int disableWakeup() override;

  protected:
    ~HandBiometricManagerSimulator() override;

  private:
    enum class Activity { kIdle, kEnrolling, kScanning, kMatching };

    struct Profile {
        uint32_t person;
        std::string name;
        HandImage image;
    };
    using Profiles = std::vector<Profile>;

    int begin(const char* operation, Activity activity);
    int end(const char* operation, Activity activity, HandEvent event);
    int finish(const char* operation, HandEvent event);
    int changeWakeup(const char* operation, bool on);
    void stepEnrollment();
    void stepScan();
    void stepMatching();
    void stepIdle();
    HandImage nextHandToMatch();
    void judge(const HandImage& image);
    void enroll(const HandImage& image);

    Profiles::iterator find(const char* name);
    /// Gives a profile a name, if that is one and free.
    int rename(Profiles::iterator profile, const char* name);

    static std::shared_ptr<HandRecord> newEvent(HandEvent event);
    void report(std::shared_ptr<HandRecord> record);

    Activity mActivity = Activity::kIdle;
    uint32_t mStep = 0;  ///< since the activity began
    Profiles mProfiles;
    uint32_t mPersons = 0;  ///< enrolled so far
    std::string mLastEnrolled;
    HandImage mHand{};  ///< on the panel while matching
    int mSecurity = 1;
    bool mWakeup = false;
    uint32_t mSequence = 0;
};

}  // namespace pemaro::simulator
