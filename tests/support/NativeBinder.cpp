// SPDX-License-Identifier: Apache-2.0
#include "tests/support/NativeBinder.h"

#include "pemaro/Binder.h"

#include <binder/ProcessState.h>
#include <gtest/gtest.h>
#include <linux/android/binder.h>
#include <sys/ioctl.h>
#include <sys/syscall.h>
#include <unistd.h>

#include <atomic>
#include <cstdarg>
#include <cstdint>
#include <cstring>

namespace pemaro::test {

namespace {

std::atomic<int> gDriverWrites{0};

// Registered while the program's static objects are made; runs before the first test.
class OpenDriver : public ::testing::Environment {
  public:
    void SetUp() override { openDriver(); }
};

[[maybe_unused]] const ::testing::Environment* const gOpenDriver =
        ::testing::AddGlobalTestEnvironment(new OpenDriver);

int writeRead(binder_write_read& transfer) {
    ++gDriverWrites;
    transfer.write_consumed = transfer.write_size;
    transfer.read_consumed = 0;
    const uint32_t answer = BR_DEAD_REPLY;
    if (transfer.read_size >= sizeof(answer)) {
        memcpy(reinterpret_cast<void*>(transfer.read_buffer), &answer, sizeof(answer));
        transfer.read_consumed = sizeof(answer);
    }
    return 0;
}

}  // namespace

void openDriver() {
    android::ProcessState::initWithDriver("/dev/zero");
}

int driverWrites() {
    return gDriverWrites;
}

}  // namespace pemaro::test

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
