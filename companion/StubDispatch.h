// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstddef>
#include <cstdint>

#include "pemaro/Binder.h"

namespace pemaro {

// What every stub of the library does with every transaction, told once: test the interface token
// before anything else, so that even a code the stub does not know must carry it; hand a code
// outside the interface's table to BBinder; else log the row's text, if it has one, and run its
// handler.

/// One transaction of an interface; row n of a table serves the code n + 1.
template <typename Service>
struct StubRow {
    /// Logged at debug priority when the request is accepted; null for nothing.
    const char* log;
    /// Reads the request, calls the operation and writes the reply; returns the transaction's
    /// result.
    android::status_t (*handle)(Service& service, const android::Parcel& data,
                                android::Parcel& reply);
};

void logAccepted(const char* tag, const char* text);

/// `fallback` is the call of BBinder::onTransact, which only the stub itself may make.
template <typename Service, size_t N, typename Fallback>
android::status_t dispatch(const char* tag, const StubRow<Service> (&rows)[N],
                           android::BBinder& stub, Service& service, uint32_t code,
                           const android::Parcel& data, android::Parcel* reply,
                           Fallback&& fallback) {
    if (!data.checkInterface(&stub)) {
        return android::PERMISSION_DENIED;
    }
    if (code < android::IBinder::FIRST_CALL_TRANSACTION || code > N) {
        return fallback();
    }
    const StubRow<Service>& row = rows[code - android::IBinder::FIRST_CALL_TRANSACTION];
    if (row.log != nullptr) {
        logAccepted(tag, row.log);
    }
    android::Parcel unwanted;  // a local caller may pass no reply parcel
    return row.handle(service, data, reply != nullptr ? *reply : unwanted);
}

/// The common end of a handler: the operation's status goes into the reply.
inline android::status_t replyStatus(android::Parcel& reply, int status) {
    reply.writeInt32(status);
    return android::NO_ERROR;
}

}  // namespace pemaro
