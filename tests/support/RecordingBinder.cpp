// SPDX-License-Identifier: Apache-2.0
#include "tests/support/RecordingBinder.h"

#include <utils/String16.h>

#include <utility>

namespace pemaro::test {

RecordingBinder::RecordingBinder() : RecordingBinder("") {}

RecordingBinder::RecordingBinder(const std::string& descriptor) : mDescriptor(descriptor.c_str()) {}

void RecordingBinder::answer(const ParcelWriter& write, android::status_t status) {
    handle([write, status](uint32_t, const android::Parcel&, android::Parcel* reply) {
        if (reply != nullptr) {
            write(*reply);
        }
        return status;
    });
}

void RecordingBinder::fail(android::status_t status) {
    answer([](android::Parcel&) {}, status);
}

void RecordingBinder::handle(Handler handler) {
    std::lock_guard<std::mutex> lock(mLock);
    mHandler = std::move(handler);
}

void RecordingBinder::forwardTo(const android::sp<android::IBinder>& target) {
    handle([target](uint32_t code, const android::Parcel& data, android::Parcel* reply) {
        return target->transact(code, data, reply, 0);
    });
}

std::vector<RecordingBinder::Transaction> RecordingBinder::transactions() const {
    std::lock_guard<std::mutex> lock(mLock);
    return mTransactions;
}

RecordingBinder::Transaction RecordingBinder::lastTransaction() const {
    std::lock_guard<std::mutex> lock(mLock);
    return mTransactions.empty() ? Transaction{} : mTransactions.back();
}

void RecordingBinder::clearTransactions() {
    std::lock_guard<std::mutex> lock(mLock);
    mTransactions.clear();
}

void RecordingBinder::setPingResult(android::status_t status) {
    std::lock_guard<std::mutex> lock(mLock);
    mPingResult = status;
}

void RecordingBinder::setLinkResult(android::status_t status) {
    std::lock_guard<std::mutex> lock(mLock);
    mLinkResult = status;
}

void RecordingBinder::setUnlinkResult(android::status_t status) {
    std::lock_guard<std::mutex> lock(mLock);
    mUnlinkResult = status;
}

int RecordingBinder::linkCalls() const {
    std::lock_guard<std::mutex> lock(mLock);
    return mLinkCalls;
}

int RecordingBinder::unlinkCalls() const {
    std::lock_guard<std::mutex> lock(mLock);
    return mUnlinkCalls;
}

int RecordingBinder::pings() const {
    std::lock_guard<std::mutex> lock(mLock);
    return mPings;
}

const android::String16& RecordingBinder::getInterfaceDescriptor() const {
    return mDescriptor;
}

android::status_t RecordingBinder::pingBinder() {
    std::lock_guard<std::mutex> lock(mLock);
    ++mPings;
    return isBinderAlive() ? mPingResult : Watchable::pingBinder();
}

android::status_t RecordingBinder::linkToDeath(const android::sp<DeathRecipient>& recipient,
                                               void* cookie, uint32_t flags) {
    std::lock_guard<std::mutex> lock(mLock);
    ++mLinkCalls;
    return isBinderAlive() && mLinkResult != android::NO_ERROR
                   ? mLinkResult
                   : Watchable::linkToDeath(recipient, cookie, flags);
}

android::status_t RecordingBinder::unlinkToDeath(const android::wp<DeathRecipient>& recipient,
                                                 void* cookie, uint32_t flags,
                                                 android::wp<DeathRecipient>* outRecipient) {
    std::lock_guard<std::mutex> lock(mLock);
    ++mUnlinkCalls;
    return isBinderAlive() && mUnlinkResult != android::NO_ERROR
                   ? mUnlinkResult
                   : Watchable::unlinkToDeath(recipient, cookie, flags, outRecipient);
}

android::status_t RecordingBinder::onTransact(uint32_t code, const android::Parcel& data,
                                              android::Parcel* reply, uint32_t flags) {
    Handler handler;
    {
        std::lock_guard<std::mutex> lock(mLock);
        mTransactions.push_back({code, flags, bytesOf(data)});
        if (!isBinderAlive()) {
            return android::DEAD_OBJECT;
        }
        handler = mHandler;
    }
    return handler ? handler(code, data, reply) : static_cast<android::status_t>(android::NO_ERROR);
}

}  // namespace pemaro::test
