// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "pemaro/Binder.h"
#include "tests/faults/Peer.h"

namespace pemaro::test {

// How a test tells faulty-services what to do, and asks how many calls are held up: transactions of
// their own, to any of the four.

constexpr uint32_t kOrderTransaction = android::IBinder::LAST_CALL_TRANSACTION - 1;
constexpr uint32_t kStalledTransaction = android::IBinder::LAST_CALL_TRANSACTION - 2;

inline void writeOrder(android::Parcel& parcel, const Order& order) {
    parcel.writeUint32(order.code);
    parcel.writeBool(order.ring);
    parcel.writeUint32(order.stalled);
    parcel.writeUint32(order.deadly);
    parcel.writeByteVector(order.reply);
}

inline Order readOrder(const android::Parcel& parcel) {
    Order order;
    order.code = parcel.readUint32();
    order.ring = parcel.readBool();
    order.stalled = parcel.readUint32();
    order.deadly = parcel.readUint32();
    parcel.readByteVector(&order.reply);
    return order;
}

}  // namespace pemaro::test
