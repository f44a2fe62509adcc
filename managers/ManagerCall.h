// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstddef>
#include <cstdint>

#include "binder/ProxyCall.h"
#include "binder/StubDispatch.h"
#include "pemaro/Binder.h"
#include "pemaro/Status.h"

namespace pemaro {

// What the three managers' interfaces share beyond ProxyCall and StubDispatch, both sides:
//
//   - The service's status is passed on without a log; a row has no text for it.
//   - A reply carries values first and the status last, as int32 each.
//   - The first two transactions register and forget the callback object of a client.
//   - Records cross as raw bytes, without a length and without a copy on the receiving side. No
//     record, which reads as null, is what null is sent as.

// ---- proxies ----

// The second one's entry has a colon and a blank; log readers know it so, and it stays.
constexpr ProxyRow kSubscribe = {android::IBinder::FIRST_CALL_TRANSACTION, "Bp::subscribe",
                                 "subscribe() error: %s"};
constexpr ProxyRow kUnsubscribe = {android::IBinder::FIRST_CALL_TRANSACTION + 1, "Bp: unsubscribe",
                                   "unsubscribe() error: %s"};

struct ManagerCall : ProxyCall {
    using ProxyCall::ProxyCall;

    /// A negative count is more bytes than any request holds: then nothing is written.
    template <typename Record>
    void writeRecords(const Record* records, int count) {
        if (records != nullptr) {
            request.write(records, static_cast<size_t>(count) * sizeof(Record));
        }
    }

    /// For subscribing and unsubscribing.
    template <typename Client>
    int transactWithClient(android::IBinder* remote, const android::sp<Client>& client) {
        writeObject(client);
        return transactForStatus(remote);
    }

    /// For the operations that answer with a number and the status.
    template <typename Value>
    int transactForValue(android::IBinder* remote, Value& value) {
        int status = transact(remote);
        if (status != STATUS_NO_ERROR) {
            return status;
        }
        value = static_cast<Value>(reply.readInt32());
        return readStatus();
    }
};

// ---- stubs ----

/// The records of a request, in place; null when there are fewer than `count` or that is negative.
template <typename Record>
Record* readRecords(const android::Parcel& data, int count) {
    const void* records = data.readInplace(static_cast<size_t>(count) * sizeof(Record));
    return static_cast<Record*>(const_cast<void*>(records));
}

/// Calls an operation that stores a number through its last argument; `call` receives the place.
/// The place is preset only so that an operation that forgets it is no undefined behaviour.
template <typename Value, typename Call>
android::status_t replyValue(android::Parcel& reply, Call&& call) {
    Value value{};
    int status = call(value);
    reply.writeInt32(static_cast<int32_t>(value));
    return replyStatus(reply, status);
}

/// The first two rows of each service's table.
template <typename Service, typename Client>
constexpr StubRow<Service> kSubscribeRow = {replyObject<&Service::subscribe, Client>,
                                            "SUBSCRIBE transact received..."};
template <typename Service, typename Client>
constexpr StubRow<Service> kUnsubscribeRow = {replyObject<&Service::unsubscribe, Client>,
                                              "UNSUBSCRIBE transact received..."};

/// The handler of an operation that tells a number.
template <auto kOperation, typename Value, typename Service>
android::status_t replyNumber(Service& service, const android::Parcel&, android::Parcel& reply) {
    return replyValue<Value>(reply, [&](Value& value) { return (service.*kOperation)(value); });
}

}  // namespace pemaro

/// Defines the proxy's constructor and the two operations that each manager's service begins with,
/// for the interface I<NAME> and callback objects of the interface CLIENT; a `Call` that takes a row
/// has to be in sight.
#define IMPLEMENT_SUBSCRIPTION(NAME, CLIENT)                            \
    Bp##NAME::Bp##NAME(const android::sp<android::IBinder>& remote)     \
            : BpInterface<I##NAME>(remote) {}                           \
    int Bp##NAME::subscribe(const android::sp<CLIENT>& client) {        \
        return Call(kSubscribe).transactWithClient(remote(), client);   \
    }                                                                   \
    int Bp##NAME::unsubscribe(const android::sp<CLIENT>& client) {      \
        return Call(kUnsubscribe).transactWithClient(remote(), client); \
    }
