// SPDX-License-Identifier: Apache-2.0
#include "binder/PlatformShims.h"

#include <gtest/gtest.h>

#include "tests/support/LocalMemory.h"

namespace pemaro::test {
namespace {

// IMemory as the releases declare it: with the one name, with both, with the other.
struct Android10Memory {
    void* pointer() const { return const_cast<int*>(&place); }
    int place = 0;
};

struct Android11Memory : Android10Memory {
    void* unsecurePointer() const { return pointer(); }
};

struct LaterMemory {
    void* unsecurePointer() const { return const_cast<int*>(&place); }
    int place = 0;
};

TEST(MappedAddress, IsFoundUnderEitherName) {
    const Android10Memory android10;
    EXPECT_EQ(&android10.place, mappedAddressOf(android10, 0));
    const Android11Memory android11;
    EXPECT_EQ(&android11.place, mappedAddressOf(android11, 0));
    const LaterMemory later;
    EXPECT_EQ(&later.place, mappedAddressOf(later, 0));
}

TEST(MappedAddress, IsWhereTheMemoryLies) {
    const android::sp<LocalMemory> memory = new LocalMemory(16);
    EXPECT_EQ(memory->bytes(), mappedAddress(memory));
    EXPECT_EQ(nullptr, mappedAddress(LocalMemory::unmapped()));
}

// Every warning is an error in the tests of a device: that this compiles is what is tested.
#pragma GCC diagnostic push
#pragma GCC diagnostic error "-Wdeprecated-declarations"

// IServiceManager of Android 10, and of Android 14.
struct PlainLookup {
    android::sp<android::IBinder> getService(const android::String16&) const { return known; }
    android::sp<android::IBinder> known = new android::BBinder;
};

struct PollingLookup : PlainLookup {
    [[deprecated("it polls")]] android::sp<android::IBinder> getService(
            const android::String16&) const {
        return known;
    }
};

TEST(PolledService, IsAskedForWithoutAWarning) {
    const PlainLookup android10;
    EXPECT_EQ(android10.known, polledService(android10, android::String16("service")));
    const PollingLookup android14;
    EXPECT_EQ(android14.known, polledService(android14, android::String16("service")));
}

#pragma GCC diagnostic pop

}  // namespace
}  // namespace pemaro::test
