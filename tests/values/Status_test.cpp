// SPDX-License-Identifier: Apache-2.0
#include "pemaro/Status.h"

#include <gtest/gtest.h>

#include <climits>

namespace pemaro {
namespace {

struct Row {
    int constant;
    unsigned code;
    const char* message;
};

const Row kRows[] = {
        {STATUS_NO_ERROR, 0x00000000, "No error"},
        {STATUS_UNKNOWN_ERROR, 0x40000000, "An unknown error has occurred"},
        {STATUS_ERROR_OPENING_FILE, 0x40000001, "Error opening file"},
        {STATUS_ERROR_PARSING_XML, 0x40000002, "Error parsing XML"},
        {STATUS_ERROR_PARSING_CONFIGURATION_SETTING, 0x40000003,
         "Error parsing configuration setting"},
        {STATUS_ERROR_WRITING_TO_FILE, 0x40000004, "Error writing to file"},
        {STATUS_INVALID_COMMAND, 0x40000005, "Invalid command"},
        {STATUS_ERROR_ALLOCATING_MEMORY, 0x40000006, "Error allocating memory"},
        {STATUS_INVALID_PACKET_SIZE, 0x40000007, "Invalid packet size"},
        {STATUS_ERROR_MEMORY_DEALER, 0x40000008, "Error involving Android Memory Dealer"},
        {STATUS_BROKEN_PIPE, 0x40000009, "Broken pipe"},
        {STATUS_ERROR_ACQUIRING_RESOURCE, 0x4000000A, "Error attempting to acquire resource"},
        {STATUS_INVALID_STATE, 0x4000000B, "Invalid state"},
        {STATUS_INVALID_FORMAT, 0x4000000C, "Invalid format"},
        {STATUS_BAD_PARAMETER, 0x4000000D, "Bad parameter"},
        {STATUS_UNSUPPORTED, 0x4000000E, "Action/command is unsupported"},
        {STATUS_ERROR_READING_FILE, 0x4000000F, "Error reading file"},
        {STATUS_ERROR_AFE_HAL, 0x40000010, "Error involving AFE HAL"},
        {STATUS_ERROR_ENVIRONMENT_GOVERNOR, 0x40000011, "Error involving Environment Governor"},
        {STATUS_ERROR_INITIALIZING_TOUCH_PROCESSOR, 0x40000012,
         "Error initializing touch processor"},
        {STATUS_INVALID_FILE_PATH, 0x40000013, "Invalid file path"},
        {STATUS_ERROR_PARSING_PARAMETER, 0x40000014, "Error parsing parameter"},
        {STATUS_TIMEOUT, 0x40000015, "Timeout has occurred"},
        {STATUS_BINDER_DIED, 0x40000016, "Binder Died"},
        {STATUS_NOT_ENOUGH_ARGS, 0x40000017, "Not enough args"},
        {STATUS_INVALID_ARGUMENTS, 0x40000018, "Invalid Arguments"},
        {STATUS_NOT_FOUND, 0x40000019, "Not Found"},
        {STATUS_DATA_EXCEEDS_BUFFER, 0x4000001A, "Data size exceeds size of buffer"},
        {STATUS_NULL_POINTER, 0x4000001B, "NULL pointer"},
        {STATUS_INDEX_OUT_OF_BOUNDS, 0x4000001C, "Index out of bounds"},
        {STATUS_CORRUPT_DATA, 0x4000001D, "Corrupt data"},
};

TEST(Status, EachConstantHasItsCodeAndItsMessage) {
    for (const Row& row : kRows) {
        SCOPED_TRACE(row.message);
        EXPECT_EQ(row.constant, static_cast<int>(row.code));
        EXPECT_STREQ(errStr(row.constant), row.message);
    }
}

TEST(Status, OtherNumbersAreUnsupported) {
    for (const int code : {-1, -32, 1, 0x3FFFFFFF, 0x4000001E, INT_MAX, INT_MIN}) {
        EXPECT_STREQ(errStr(code), "Unsupported error code") << code;
    }
}

TEST(Status, AMessageIsOneAndTheSameText) {
    EXPECT_EQ(errStr(STATUS_TIMEOUT), errStr(STATUS_TIMEOUT));
}

}  // namespace
}  // namespace pemaro
