// SPDX-License-Identifier: Apache-2.0
#include "binder/ProxyCall.h"

#include <log/log.h>

#include <cstring>

#include "binder/Log.h"
#include "pemaro/Status.h"

namespace pemaro {

namespace {
/// What a release's interface token has besides the characters of the descriptor, at most.
constexpr size_t kTokenBytes = 32;
}  // namespace

ProxyCall::ProxyCall(const char* tag, const ProxyRow& row, const android::String16& descriptor,
                     size_t argumentBytes)
        : mTag(tag), mRow(row) {
    logText(ANDROID_LOG_DEBUG, mTag, mRow.entry);
    if (argumentBytes != 0) {
        request.setDataCapacity(kTokenBytes + descriptor.size() * sizeof(char16_t) + argumentBytes);
    }
    request.writeInterfaceToken(descriptor);
}

int ProxyCall::transact(android::IBinder* remote) {
    android::status_t status = remote->transact(mRow.code, request, &reply, 0);
    if (status == android::NO_ERROR) {
        return STATUS_NO_ERROR;
    }
    if (mRow.transportError != nullptr) {
        __android_log_print(ANDROID_LOG_ERROR, mTag, mRow.transportError, transportText(status));
    }
    return STATUS_UNKNOWN_ERROR;
}

int ProxyCall::readStatus() {
    int status = reply.readInt32();
    if (status != STATUS_NO_ERROR && mRow.remoteError != nullptr) {
        __android_log_print(ANDROID_LOG_ERROR, mTag, mRow.remoteError, errStr(status));
    }
    return status;
}

int ProxyCall::transactForStatus(android::IBinder* remote) {
    int status = transact(remote);
    return status == STATUS_NO_ERROR ? readStatus() : status;
}

const char* transportText(android::status_t status) {
    // In unsigned arithmetic: the platform's UNKNOWN_ERROR is the one number that has no negative.
    return strerror(static_cast<int>(0u - static_cast<unsigned int>(status)));
}

}  // namespace pemaro
