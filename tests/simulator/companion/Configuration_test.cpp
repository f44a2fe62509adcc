// SPDX-License-Identifier: Apache-2.0
#include "simulator/companion/Configuration.h"

#include <gtest/gtest.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cstring>
#include <fstream>
#include <string>

#include "frames/Checksum.h"
#include "pemaro/Status.h"
#include "tests/support/MapText.h"

namespace pemaro::simulator {

using test::mapOf;

namespace {

SerializableMap wanted(std::initializer_list<const char*> keys) {
    SerializableMap map;
    for (const char* key : keys) {
        map.add(key, std::string());
    }
    return map;
}

std::string textOf(const Configuration& configuration, const char* key) {
    SerializableMap map = wanted({key});
    EXPECT_EQ(0, configuration.get(map));
    return map.serialize();
}

// Makes the checksum of an altered binary configuration right again.
std::string seal(std::string binary) {
    memset(&binary[12], 0, 4);
    const uint32_t checksum = frames::crc32(binary.data(), binary.size());
    memcpy(&binary[12], &checksum, sizeof(checksum));
    return binary;
}

int fromBinary(Configuration& configuration, const std::string& binary) {
    return configuration.fromBinary(binary.data(), binary.size());
}

class File {
  public:
    explicit File(const std::string& contents)
            : path(testing::TempDir() + "Configuration_test." + std::to_string(getpid())) {
        std::ofstream(path) << contents;
    }
    ~File() { unlink(path.c_str()); }

    const std::string path;
};

}  // namespace

TEST(Configuration, GivesTheValuesOfTheKeysWanted) {
    const Configuration configuration;
    SerializableMap map = wanted({"gain", "panel.size", "edge.zones", "palm.rejection"});
    EXPECT_EQ(0, configuration.get(map));
    EXPECT_EQ(
            "{\"edge.zones\":[0,120,240],\"gain\":1.500000,\"palm.rejection\":true,"
            "\"panel.size\":{\"height\":2340,\"width\":1080}}",
            map.serialize());
}

TEST(Configuration, KnowsNoOtherKeys) {
    const Configuration configuration;
    SerializableMap map = wanted({"gain", "volume"});
    const std::string before = map.serialize();
    EXPECT_EQ(STATUS_NOT_FOUND, configuration.get(map));
    EXPECT_EQ(before, map.serialize());
}

TEST(Configuration, TakesAllChangesOrNone) {
    Configuration configuration;
    EXPECT_EQ(0, configuration.set(mapOf("{\"gain\":2.5}")));
    EXPECT_EQ("{\"gain\":2.5}", textOf(configuration, "gain"));
    EXPECT_EQ(STATUS_ERROR_PARSING_CONFIGURATION_SETTING,
              configuration.set(mapOf("{\"gain\":3,\"volume\":1}")));
    EXPECT_EQ("{\"gain\":2.5}", textOf(configuration, "gain"));
}

TEST(Configuration, IsSavedAndLoaded) {
    File file("");
    Configuration configuration;
    ASSERT_EQ(0, configuration.set(mapOf("{\"gain\":2.5,\"device.name\":\"glass\"}")));
    ASSERT_EQ(0, configuration.save(file.path));
    Configuration other;
    EXPECT_EQ(0, other.load(file.path));
    EXPECT_EQ("{\"device.name\":\"glass\"}", textOf(other, "device.name"));
    EXPECT_EQ("{\"gain\":2.5}", textOf(other, "gain"));
}

TEST(Configuration, LoadsNothingFromABadFile) {
    const struct {
        const char* contents;
        int status;
    } rows[] = {
            {"", STATUS_ERROR_PARSING_CONFIGURATION_SETTING},
            {"gain=3", STATUS_ERROR_PARSING_CONFIGURATION_SETTING},
            {"{\"gain\":3", STATUS_ERROR_PARSING_CONFIGURATION_SETTING},
            {"{\"gain\":3,\"volume\":1}", STATUS_ERROR_PARSING_CONFIGURATION_SETTING},
    };
    for (const auto& row : rows) {
        File file(row.contents);
        Configuration configuration;
        EXPECT_EQ(row.status, configuration.load(file.path)) << row.contents;
        EXPECT_EQ("{\"gain\":1.500000}", textOf(configuration, "gain"));
    }
    Configuration configuration;
    EXPECT_EQ(STATUS_ERROR_OPENING_FILE, configuration.load("/no/such/file"));
    EXPECT_EQ(STATUS_ERROR_READING_FILE, configuration.load("/"));
    EXPECT_EQ(STATUS_DATA_EXCEEDS_BUFFER, configuration.load("/dev/zero"));

    // One that nobody writes to holds nothing.
    const std::string fifo = testing::TempDir() + "Configuration_test." + std::to_string(getpid());
    ASSERT_EQ(0, mkfifo(fifo.c_str(), 0600));
    EXPECT_EQ(STATUS_ERROR_PARSING_CONFIGURATION_SETTING, configuration.load(fifo));
    unlink(fifo.c_str());
}

TEST(Configuration, TellsWhatKeepsItFromBeingSaved) {
    const Configuration configuration;
    EXPECT_EQ(STATUS_ERROR_OPENING_FILE, configuration.save("/no/such/folder/file"));
    EXPECT_EQ(STATUS_ERROR_OPENING_FILE, configuration.save(testing::TempDir()));
}

TEST(Configuration, GoesThroughItsBinaryForm) {
    Configuration configuration;
    ASSERT_EQ(0, configuration.set(mapOf("{\"gain\":2.5}")));
    configuration.calibrate(77);
    const std::string binary = configuration.toBinary();
    EXPECT_GT(binary.size(), 4096u);
    EXPECT_LT(binary.size(), 8192u);
    EXPECT_EQ(0, memcmp(binary.data(), "ZCFG\1\0\0\0", 8));
    Configuration other;
    EXPECT_NE(binary, other.toBinary());
    EXPECT_EQ(0, fromBinary(other, binary));
    EXPECT_EQ(binary, other.toBinary());
}

TEST(Configuration, RefusesABinaryFormThatIsNotIntact) {
    Configuration configuration;
    const std::string intact = configuration.toBinary();
    const auto altered = [&intact](size_t position, char byte) {
        std::string binary = intact;
        binary[position] = byte;
        return binary;
    };
    const struct {
        const char* what;
        std::string binary;
        int status;
    } rows[] = {
            {"nothing", "", STATUS_INVALID_FORMAT},
            {"half a header", intact.substr(0, 12), STATUS_INVALID_FORMAT},
            {"magic", seal(altered(0, 'X')), STATUS_INVALID_FORMAT},
            {"version", seal(altered(4, 2)), STATUS_INVALID_FORMAT},
            {"cut off", intact.substr(0, intact.size() - 1), STATUS_CORRUPT_DATA},
            {"too long", intact + "x", STATUS_CORRUPT_DATA},
            {"length", seal(altered(8, 1)), STATUS_CORRUPT_DATA},
            {"text length", seal(altered(16, 1)), STATUS_CORRUPT_DATA},
            {"huge text length", seal(altered(19, '\xFF')), STATUS_CORRUPT_DATA},
            {"cells", seal(altered(20, 1)), STATUS_CORRUPT_DATA},
            {"a flipped bit", altered(intact.size() - 1, '\x01'), STATUS_CORRUPT_DATA},
            {"a text that is no map", seal(altered(24, '[')),
             STATUS_ERROR_PARSING_CONFIGURATION_SETTING},
            {"an unknown key", seal(altered(26, 'X')), STATUS_ERROR_PARSING_CONFIGURATION_SETTING},
    };
    for (const auto& row : rows) {
        EXPECT_EQ(row.status, fromBinary(configuration, row.binary)) << row.what;
        EXPECT_EQ(intact, configuration.toBinary()) << row.what;
    }
}

TEST(Configuration, IsCalibratedBySeed) {
    Configuration one;
    Configuration other;
    one.calibrate(1);
    other.calibrate(2);
    EXPECT_NE(one.toBinary(), other.toBinary());
    other.calibrate(1);
    EXPECT_EQ(one.toBinary(), other.toBinary());
}

}  // namespace pemaro::simulator
