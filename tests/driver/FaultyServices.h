// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "pemaro/Binder.h"
#include "tests/faults/Peer.h"

namespace pemaro::test {

// How a test tells faulty-services what to do: a transaction of its own, to any of the four.

constexpr uint32_t kOrderTransaction = android::IBinder::LAST_CALL_TRANSACTION - 1;

inline void writeOrder(android::Parcel& parcel, const Order& order) {
    parcel.writeUint32(order.deadly);
    parcel.writeInt32(order.delayMillis);
    parcel.writeByteVector(order.reply);
}

inline Order readOrder(const android::Parcel& parcel) {
    Order order;
    order.deadly = parcel.readUint32();
    order.delayMillis = parcel.readInt32();
    parcel.readByteVector(&order.reply);
    return order;
}

}  // namespace pemaro::test
