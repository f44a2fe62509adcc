// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "managers/ManagerCall.h"

namespace pemaro {

// What the managers' callback interfaces share, which is all but their names, texts and records:
// one transaction that hands a record to the client, and the client's status.

/// What a callback interface logs; see ProxyRow and StubRow.
struct CallbackTexts {
    const char* entry;
    const char* transportError;
    const char* received;
};

constexpr ProxyRow callbackRow(const CallbackTexts& texts) {
    return {android::IBinder::FIRST_CALL_TRANSACTION, texts.entry, texts.transportError};
}

template <auto kOperation, typename Record, typename Client>
android::status_t replyRecord(Client& client, const android::Parcel& data, android::Parcel& reply) {
    return replyStatus(reply, (client.*kOperation)(readRecords<Record>(data, 1)));
}

}  // namespace pemaro

/// Defines the interface I<NAME>, its proxy and its stub, inside the namespace: DESCRIPTOR is its
/// name on the wire, OPERATION takes a pointer to the nested type RECORD, TEXTS is a constexpr
/// CallbackTexts. All log under LOG_TAG.
#define IMPLEMENT_MANAGER_CALLBACK(NAME, DESCRIPTOR, OPERATION, RECORD, TEXTS)               \
    Bp##NAME::Bp##NAME(const android::sp<android::IBinder>& remote)                          \
            : BpInterface<I##NAME>(remote) {}                                                \
    int Bp##NAME::OPERATION(RECORD* data) { /* NOLINT(bugprone-macro-parentheses): a type */ \
        static constexpr ProxyRow kRow = callbackRow(TEXTS);                                 \
        ManagerCall call(LOG_TAG, kRow, descriptor, sizeof(RECORD));                         \
        call.writeRecords(data, 1);                                                          \
        return call.transactForStatus(remote());                                             \
    }                                                                                        \
    IMPLEMENT_META_INTERFACE(NAME, DESCRIPTOR)                                               \
    static constexpr StubRow<I##NAME> k##NAME##Rows[] = {                                    \
            {replyRecord<&I##NAME::OPERATION, I##NAME::RECORD>, (TEXTS).received},           \
    };                                                                                       \
    IMPLEMENT_STUB(NAME, k##NAME##Rows)
