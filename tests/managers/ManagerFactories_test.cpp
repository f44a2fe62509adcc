// SPDX-License-Identifier: Apache-2.0
#include "pemaro/ManagerFactories.h"

#include <dlfcn.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "tests/support/LogLines.h"

namespace pemaro::test {
namespace {

using android::sp;

int gEvents;
int gDeaths;

template <typename Record>
void countEvent(Record*, void* context) {
    gEvents += *static_cast<int*>(context);
}

void countDeath(void* context) {
    gDeaths += *static_cast<int*>(context);
}

// The factory as a caller finds it that loads the library.
template <typename Factory>
Factory* byName(const char* name, Factory*) {
    return reinterpret_cast<Factory*>(dlsym(RTLD_DEFAULT, name));
}

#define FACTORY(name) byName(#name, &name)

class ManagerFactories : public ::testing::Test {
  protected:
    void SetUp() override {
        gEvents = 0;
        gDeaths = 0;
    }

    int mContext = 3;
};

TEST_F(ManagerFactories, MakeATouchManagerClient) {
    auto create = FACTORY(VEXPemaroTouchManagerClientCreateInstance);
    ASSERT_NE(nullptr, create);
    TouchManagerClient* made = nullptr;
    EXPECT_EQ(0, create(&made, countEvent<ITouchManagerClient::GestureData>, &mContext));
    ASSERT_NE(nullptr, made);
    // The caller's reference is the first.
    sp<TouchManagerClient> client = made;
    EXPECT_EQ(1, client->getStrongCount());
    EXPECT_EQ(0, client->gestureCallback(nullptr));
    EXPECT_EQ(3, gEvents);

    clearLog();
    client.clear();
    EXPECT_EQ("D ~TouchManagerClient(): X", linesOf("TouchManagerClient").back());
}

TEST_F(ManagerFactories, MakeAGestureManagerClient) {
    auto create = FACTORY(VEXPemaroGestureManagerClientCreateInstance);
    ASSERT_NE(nullptr, create);
    GestureManagerClient* made = nullptr;
    EXPECT_EQ(0,
              create(&made, countEvent<IGestureManagerClient::GestureData>, countDeath, &mContext));
    ASSERT_NE(nullptr, made);
    const sp<GestureManagerClient> client = made;
    EXPECT_EQ(1, client->getStrongCount());
    EXPECT_EQ(0, client->gestureCallback(nullptr));
    EXPECT_EQ(3, gEvents);
    client->binderDied(nullptr);
    EXPECT_EQ(3, gDeaths);
}

TEST_F(ManagerFactories, MakeAHandBiometricManagerClient) {
    auto create = FACTORY(VEXPemaroHandBiometricManagerClientCreateInstance);
    ASSERT_NE(nullptr, create);
    HandBiometricManagerClient* made = nullptr;
    EXPECT_EQ(0, create(&made, countEvent<IHandBiometricManagerClient::HandBioData>, countDeath,
                        &mContext));
    ASSERT_NE(nullptr, made);
    const sp<HandBiometricManagerClient> client = made;
    EXPECT_EQ(1, client->getStrongCount());
    EXPECT_EQ(0, client->handBiometricCallback(nullptr));
    EXPECT_EQ(3, gEvents);
    client->binderDied(nullptr);
    EXPECT_EQ(3, gDeaths);
}

TEST_F(ManagerFactories, MakeANewClientEachTime) {
    GestureManagerClient* first = nullptr;
    GestureManagerClient* second = nullptr;
    VEXPemaroGestureManagerClientCreateInstance(&first, nullptr, nullptr, nullptr);
    const sp<GestureManagerClient> holdFirst = first;
    VEXPemaroGestureManagerClientCreateInstance(&second, nullptr, nullptr, nullptr);
    const sp<GestureManagerClient> holdSecond = second;
    EXPECT_NE(first, second);
}

}  // namespace
}  // namespace pemaro::test
