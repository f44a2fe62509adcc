// SPDX-License-Identifier: Apache-2.0
#include "pemaro/testkit/NativeBinder.h"

#include <binder/ProcessState.h>
#include <linux/android/binder.h>
#include <sys/ioctl.h>
#include <sys/syscall.h>
#include <unistd.h>

#include <atomic>
#include <cstdarg>
#include <cstdint>
#include <cstring>
#include <mutex>

namespace pemaro::test {

namespace {

std::atomic<int> gDriverWrites{0};

std::mutex gManagerLock;
android::sp<android::IServiceManager> gManager;

int writeRead(binder_write_read& transfer) {
    ++gDriverWrites;
    transfer.write_consumed = transfer.write_size;
    transfer.read_consumed = 0;
    const uint32_t answer = BR_DEAD_REPLY;
    if (transfer.read_size >= sizeof(answer)) {
        // The driver's interface has addresses as numbers.
        // NOLINTNEXTLINE(performance-no-int-to-ptr)
        memcpy(reinterpret_cast<void*>(transfer.read_buffer), &answer, sizeof(answer));
        transfer.read_consumed = sizeof(answer);
    }
    return 0;
}

}  // namespace

void openDriver() {
    android::ProcessState::initWithDriver("/dev/zero");
}

void useServiceManager(const android::sp<android::IServiceManager>& manager) {
    std::lock_guard<std::mutex> lock(gManagerLock);
    gManager = manager;
}

int driverWrites() {
    return gDriverWrites;
}

}  // namespace pemaro::test

// Takes the place of libbinder's.
android::sp<android::IServiceManager> android::defaultServiceManager() {
    std::lock_guard<std::mutex> lock(pemaro::test::gManagerLock);
    return pemaro::test::gManager;
}

// Takes the place of the C library's, for libbinder as well; requests that are not the driver's go
// to the kernel. A sanitizer's interceptor of the same name gives way to it too.
extern "C" int ioctl(int fd, unsigned long request, ...) noexcept {
    va_list arguments;
    va_start(arguments, request);
    void* argument = va_arg(arguments, void*);
    va_end(arguments);
    switch (request) {
        case BINDER_VERSION:
            static_cast<binder_version*>(argument)->protocol_version =
                    BINDER_CURRENT_PROTOCOL_VERSION;
            return 0;
        case BINDER_WRITE_READ:
            return pemaro::test::writeRead(*static_cast<binder_write_read*>(argument));
        case BINDER_SET_MAX_THREADS:
        case BINDER_THREAD_EXIT:
            return 0;
        default:
            return static_cast<int>(syscall(SYS_ioctl, fd, request, argument));
    }
}
