// SPDX-License-Identifier: Apache-2.0
#include "tests/faults/OrderedAnswers.h"

#include "pemaro/RingWriter.h"

namespace pemaro::test {

namespace {

constexpr uint32_t kGetCblk = 4;

bool isMeant(uint32_t ordered, uint32_t code) {
    return ordered == Order::kAnyCall || ordered == code;
}

}  // namespace

void OrderedAnswers::order(const Order& order) {
    std::lock_guard<std::mutex> guard(mLock);
    mOrder = order;
    ++mOrders;
    mChanged.notify_all();
}

int OrderedAnswers::stalled() const {
    std::lock_guard<std::mutex> guard(mLock);
    return mStalled;
}

bool OrderedAnswers::answer(uint32_t code, android::Parcel* reply) {
    std::unique_lock<std::mutex> guard(mLock);
    if (isMeant(mOrder.stalled, code)) {
        ++mStalled;
        mChanged.wait(guard, [this, before = mOrders] { return mOrders != before; });
        --mStalled;
    }
    const Order order = mOrder;
    guard.unlock();
    if (isMeant(order.deadly, code)) {
        return false;
    }
    if (isMeant(order.code, code)) {
        reply->write(order.reply.data(), order.reply.size());
    } else if (order.ring && code == kGetCblk) {
        const auto memory = RingWriter::create(16, 2)->memory();
        reply->writeStrongBinder(android::IInterface::asBinder(memory));
    } else {
        const Bytes zeros(16);
        reply->write(zeros.data(), zeros.size());
    }
    return true;
}

}  // namespace pemaro::test
