// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstddef>
#include <cstdint>

#include "binder/Log.h"
#include "pemaro/Binder.h"

namespace pemaro {

// What every stub of the library does with every transaction, told once: test the interface token
// before anything else, so that even a code the stub does not know must carry it; hand a code
// outside the interface's table to BBinder; else run the row's handler between the row's two texts.

/// One transaction of an interface; row n of a table serves the code n + 1.
template <typename Service>
struct StubRow {
    /// Reads the request, calls the operation and writes the reply; returns the transaction's
    /// result.
    android::status_t (*handle)(Service& service, const android::Parcel& data,
                                android::Parcel& reply);
    /// Logged at debug priority when the request is accepted; null for nothing.
    const char* received = nullptr;
    /// Logged at debug priority when the reply is written; null for nothing.
    const char* finished = nullptr;
};

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
    logText(ANDROID_LOG_DEBUG, tag, row.received);
    android::status_t result;
    if (reply != nullptr) {
        result = row.handle(service, data, *reply);
    } else {  // a local caller may pass no reply parcel
        android::Parcel unwanted;
        result = row.handle(service, data, unwanted);
    }
    logText(ANDROID_LOG_DEBUG, tag, row.finished);
    return result;
}

/// The common end of a handler: the operation's status goes into the reply.
inline android::status_t replyStatus(android::Parcel& reply, int status) {
    reply.writeInt32(status);
    return android::NO_ERROR;
}

/// The handler of an operation without arguments.
template <auto kOperation, typename Service>
android::status_t replyPlain(Service& service, const android::Parcel&, android::Parcel& reply) {
    return replyStatus(reply, (service.*kOperation)());
}

/// The handler of an operation on one number.
template <auto kOperation, typename Service>
android::status_t replyInt(Service& service, const android::Parcel& data, android::Parcel& reply) {
    return replyStatus(reply, (service.*kOperation)(data.readInt32()));
}

/// The handler of an operation on an object of the caller's, which crosses as a strong binder.
template <auto kOperation, typename Interface, typename Service>
android::status_t replyObject(Service& service, const android::Parcel& data,
                              android::Parcel& reply) {
    return replyStatus(reply,
                       (service.*kOperation)(Interface::asInterface(data.readStrongBinder())));
}

}  // namespace pemaro

/// Defines the onTransact of the stub Bn<NAME>, which serves the interface I<NAME> by the table
/// ROWS and logs under LOG_TAG; as the platform's IMPLEMENT_META_INTERFACE, inside the namespace.
#define IMPLEMENT_STUB(NAME, ROWS)                                                               \
    android::status_t Bn##NAME::onTransact(uint32_t code, const android::Parcel& data,           \
                                           android::Parcel* reply, uint32_t flags) {             \
        I##NAME& service = *this;                                                                \
        return dispatch(LOG_TAG, ROWS, *this, service, code, data, reply,                        \
                        [&] { return android::BBinder::onTransact(code, data, reply, flags); }); \
    }
