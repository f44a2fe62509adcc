// SPDX-License-Identifier: Apache-2.0
#include "simulator/companion/Device.h"

#include <gtest/gtest.h>

#include <string>

#include "pemaro/Status.h"
#include "tests/support/MapText.h"

namespace pemaro::simulator {

using test::mapOf;

TEST(Device, RestoresASessionWithAllItsSettings) {
    Device device("secret");
    device.setFilter(frames::kFilterImage);
    ASSERT_EQ(0, device.setAfe(mapOf("{\"frequency\":300000}")));
    device.configuration().calibrate(5);
    const std::string afe = device.afe().serialize();
    const std::string configuration = device.configuration().toBinary();
    const int session = device.saveSession();
    EXPECT_EQ(1, session);

    device.setFilter(0);
    ASSERT_EQ(0, device.setAfe(mapOf("{\"frequency\":1}")));
    device.configuration().calibrate(6);
    EXPECT_EQ(2, device.saveSession());

    EXPECT_EQ(0, device.restoreSession(session));
    EXPECT_EQ(frames::kFilterImage, device.filter());
    EXPECT_EQ(afe, device.afe().serialize());
    EXPECT_EQ(configuration, device.configuration().toBinary());
    EXPECT_EQ(0, device.restoreSession(2));
    EXPECT_EQ(0u, device.filter());
}

TEST(Device, KnowsNoSessionThatWasNotSaved) {
    Device device("secret");
    for (int id : {-1, 0, 1}) {
        EXPECT_EQ(STATUS_NOT_FOUND, device.restoreSession(id));
    }
}

TEST(Device, ForgetsTheOldestSessionsAndNumbersOn) {
    Device device("secret");
    for (int id = 1; id <= 40; ++id) {
        EXPECT_EQ(id, device.saveSession());
    }
    EXPECT_EQ(STATUS_NOT_FOUND, device.restoreSession(1));
    EXPECT_EQ(0, device.restoreSession(40));
}

TEST(Device, LetsOnlyTheAuthenticatedResetIt) {
    Device device("secret");
    device.setFilter(0);
    EXPECT_EQ(STATUS_INVALID_STATE, device.resetToFactory());
    EXPECT_EQ(STATUS_BAD_PARAMETER, device.authenticate("guess"));
    EXPECT_EQ(STATUS_INVALID_STATE, device.resetToFactory());
    EXPECT_EQ(0u, device.filter());
    EXPECT_EQ(0, device.authenticate("secret"));
    EXPECT_EQ(0, device.resetToFactory());
    EXPECT_EQ(frames::kFilterDefault, device.filter());
    EXPECT_EQ(STATUS_BAD_PARAMETER, device.authenticate(""));
    EXPECT_EQ(STATUS_INVALID_STATE, device.resetToFactory());
}

TEST(Device, TakesParametersOfTheFrontEndAllOrNone) {
    Device device("secret");
    const std::string before = device.afe().serialize();
    EXPECT_EQ("{\"drive.voltage\":3.300000,\"frequency\":250000,\"integration.cycles\":16}",
              before);
    EXPECT_EQ(STATUS_BAD_PARAMETER, device.setAfe(mapOf("{\"frequency\":1,\"colour\":2}")));
    EXPECT_EQ(before, device.afe().serialize());
    EXPECT_EQ(0, device.setAfe(mapOf("{\"frequency\":1}")));
    EXPECT_EQ("{\"drive.voltage\":3.300000,\"frequency\":1,\"integration.cycles\":16}",
              device.afe().serialize());
}

TEST(Device, TellsTheFrontEndChannelByChannel) {
    Device device("secret");
    SerializableMapArray channels = device.afeChannels();
    EXPECT_EQ(0u, channels.serialize().find("[{\"channel\":0,\"drive.voltage\":3.300000,"));
    for (int channel = 0; channel < 4; ++channel) {
        SerializableMap params;
        EXPECT_EQ(0, channels.get(channel).getValue(params));
        int number = -1;
        EXPECT_EQ(0, params.valueFor("channel").getValue(number));
        EXPECT_EQ(channel, number);
    }
}

TEST(Device, TellsItsPropertiesAsTheyAre) {
    Device device("secret");
    EXPECT_EQ(
            "{\"authenticated\":false,\"events\":0,\"recordFilter\":3,\"rollingLogSize\":256,"
            "\"sessions\":0}",
            device.properties().serialize());
    device.authenticate("secret");
    device.countEvent();
    device.setFilter(1);
    device.saveSession();
    EXPECT_EQ(0, device.setRollingLogSize(1024));
    EXPECT_EQ(STATUS_BAD_PARAMETER, device.setRollingLogSize(-1));
    EXPECT_EQ(STATUS_BAD_PARAMETER, device.setRollingLogSize(65537));
    EXPECT_EQ(
            "{\"authenticated\":true,\"events\":1,\"recordFilter\":1,\"rollingLogSize\":1024,"
            "\"sessions\":1}",
            device.properties().serialize());
}

}  // namespace pemaro::simulator
