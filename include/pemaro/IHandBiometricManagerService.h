// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>
#include <vector>

#include "pemaro/Binder.h"
#include "pemaro/Export.h"
#include "pemaro/IHandBiometricManagerClient.h"

namespace pemaro {

/// The Binder interface of the hand biometric manager: enrollment, scanning and matching of hands,
/// and the profiles that result.
///
/// The service is registered with the service manager as "pemaro.HandBiometricManagerService",
/// which is the descriptor too. Every call is one synchronous transaction on the caller's thread
/// and returns a status: 0, or the service's own status, unchanged. Through a proxy it is
/// 0x40000000 when the transaction failed, whatever the reason, which is logged under the tag
/// "IHandBiometricManagerService"; no result is then stored.
///
/// Names are C strings. A proxy cannot send null: it returns 0x4000001B without a transaction. An
/// implementation gets names that lie in the incoming request and are valid during the call, and
/// null for a name that the request did not hold.
///
/// The operations stand in the order of their virtual slots, which callers are compiled against.
class ZELK_API IHandBiometricManagerService : public android::IInterface {
  public:
    DECLARE_META_INTERFACE(HandBiometricManagerService)

    /// Reports every further event to `client`, which the service keeps a reference to.
    virtual int subscribe(const android::sp<IHandBiometricManagerClient>& client) = 0;

    /// Ends the reports to `client`.
    virtual int unsubscribe(const android::sp<IHandBiometricManagerClient>& client) = 0;

    /// Starts enrolling a hand as a new profile.
    virtual int startEnrollment() = 0;

    /// Ends the enrollment.
    virtual int stopEnrollment() = 0;

    /// Scans a hand.
    virtual int scan() = 0;

    /// Starts matching hands against the profiles.
    virtual int startMatching() = 0;

    /// Ends the matching.
    virtual int stopMatching() = 0;

    /// Gives a scan up.
    virtual int cancelScan() = 0;

    /// Sets the security level, a number whose meaning the service defines.
    virtual int setSecurity(int level) = 0;

    /// Names a profile.
    virtual int setProfileName(const char* name) = 0;

    /// Forgets a profile.
    virtual int deleteProfile(const char* name) = 0;

    /// Renames a profile. The service defines which of the two names is the current one; they
    /// travel in this order.
    virtual int renameProfile(const char* first, const char* second) = 0;

    /// How many profiles the device holds at most. An implementation sets `count` whatever it
    /// returns.
    virtual int getMaxUser(unsigned int& count) = 0;

    /// Appends the names of all profiles to `names`, which keeps what it held. A proxy returns
    /// 0x4000001D when the reply holds fewer names than it announces, or no status behind them; the
    /// names before that are appended, and the four bytes of a status never are.
    virtual int getProfileList(std::vector<std::string>& names) = 0;

    /// Lets a hand wake the device.
    virtual int enableWakeup() = 0;

    /// Keeps hands from waking the device.
    virtual int disableWakeup() = 0;
};

}  // namespace pemaro
