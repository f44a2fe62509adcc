// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <utils/String16.h>

#include <cstddef>
#include <cstdint>

#include "pemaro/Binder.h"

namespace pemaro {

// What every proxy of the library does for every operation, told once:
//
//   1. log the operation's entry text (debug) and write the interface token, then the arguments;
//   2. transact, synchronously; a transport failure becomes 0x40000000, whatever it was, and is
//      logged (error) with the text of its negated status;
//   3. read the reply; the service's status is passed on unchanged, and a failure is logged (error)
//      with its message where the operation has a text for that.
//
// An operation states its row and its arguments:
//
//     int BpFoo::sendEvent(int type, int param) {
//         ProxyCall call(kTag, kSendEvent, descriptor);
//         call.request.writeInt32(type);
//         call.request.writeInt32(param);
//         return call.transactForStatus(remote());
//     }

/// What distinguishes one operation. The texts are log formats with one %s for the reason, null
/// where nothing is logged.
struct ProxyRow {
    uint32_t code;
    const char* entry;
    const char* transportError;
    const char* remoteError = nullptr;
};

class ProxyCall {
  public:
    /// Logs the entry text and begins the request with the interface token. For arguments of many
    /// bytes, told beforehand, the request is allocated once instead of growing.
    ProxyCall(const char* tag, const ProxyRow& row, const android::String16& descriptor,
              size_t argumentBytes = 0);

    android::Parcel request;
    android::Parcel reply;

    /// Sends the request: 0, or STATUS_UNKNOWN_ERROR with the failure logged.
    int transact(android::IBinder* remote);

    /// Reads the service's status, the next int32 of the reply, and logs it if it is a failure.
    int readStatus();

    /// Both: for the operations whose reply begins with the status.
    int transactForStatus(android::IBinder* remote);

    /// An object of the caller's goes into the request as a strong binder.
    template <typename Interface>
    void writeObject(const android::sp<Interface>& object) {
        request.writeStrongBinder(android::IInterface::asBinder(object));
    }

  private:
    const char* const mTag;
    const ProxyRow& mRow;
};

/// The text of a failed transport status, which is a negative errno.
const char* transportText(android::status_t status);

}  // namespace pemaro
