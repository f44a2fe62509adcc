// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "pemaro/Binder.h"
#include "pemaro/Export.h"
#include "pemaro/IGestureManagerClient.h"

namespace pemaro {

/// The Binder interface of the gesture manager: wake-up gestures, gesture detection and the
/// gestures that the user defines.
///
/// The service is registered with the service manager as "pemaro.GestureManagerService", which is
/// the descriptor too. Every call is one synchronous transaction on the caller's thread and returns
/// a status: 0, or the service's own status, unchanged. Through a proxy it is 0x40000000 when the
/// transaction failed, whatever the reason, which is logged under the tag "IGestureManagerService";
/// no result is then stored.
///
/// Gestures are known by numbers that the service gives them. The records that an implementation
/// receives lie in the incoming request and are valid during the call; a pointer is null when the
/// request held fewer records than announced, which an implementation must accept. A proxy sends no
/// records for null.
///
/// The operations stand in the order of their virtual slots, which callers are compiled against.
class ZELK_API IGestureManagerService : public android::IInterface {
  public:
    DECLARE_META_INTERFACE(GestureManagerService)

    /// Reports every further gesture to `client`, which the service keeps a reference to.
    virtual int subscribe(const android::sp<IGestureManagerClient>& client) = 0;

    /// Ends the reports to `client`.
    virtual int unsubscribe(const android::sp<IGestureManagerClient>& client) = 0;

    /// Lets gestures wake the device.
    virtual int enableWakeup() = 0;

    /// Keeps gestures from waking the device.
    virtual int disableWakeup() = 0;

    /// Starts looking for gestures.
    virtual int startGestureDetection() = 0;

    /// Stops looking for gestures.
    virtual int stopGestureDetection() = 0;

    /// Stores a gesture that the user recorded as `count` samples, one after another at `samples`;
    /// the service defines `result`, which it sets whatever it returns.
    ///
    /// All samples travel in one transaction: more of them than the service's transaction buffer
    /// has room for (14 at the platform's size of just under 1 MiB) end in 0x40000000. A `count`
    /// that is negative, or that makes 2 GiB or more, travels alone, and the service gets null.
    virtual int addGesture(int count, IGestureManagerClient::GestureData* samples, int& result) = 0;

    /// Forgets a stored gesture.
    virtual int deleteGesture(int gesture) = 0;

    /// Takes a stored gesture into account again.
    virtual int enableGesture(int gesture) = 0;

    /// Keeps a stored gesture, but does not look for it.
    virtual int disableGesture(int gesture) = 0;

    /// Compares one drawn gesture with the stored ones; the service defines `result`, which it sets
    /// whatever it returns. The transaction is known as VERIFY_GESTURE.
    virtual int improveGestureTraining(IGestureManagerClient::GestureData* sample, int& result) = 0;

    /// How many gestures the device brings along. An implementation sets `count` whatever it
    /// returns.
    virtual int getMaxPreDefinedGesture(unsigned int& count) = 0;

    /// How many gestures a user can define. An implementation sets `count` whatever it returns.
    virtual int getMaxUserDefinedGesture(unsigned int& count) = 0;
};

}  // namespace pemaro
