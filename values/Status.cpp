// SPDX-License-Identifier: Apache-2.0
#include "pemaro/Status.h"

#include <cstdint>
#include <iterator>

namespace pemaro {

namespace {

constexpr uint32_t kFirstCode = 0x40000000;

/// The messages of the codes, from kFirstCode upwards.
constexpr const char* kMessages[] = {
        "An unknown error has occurred",
        "Error opening file",
        "Error parsing XML",
        "Error parsing configuration setting",
        "Error writing to file",
        "Invalid command",
        "Error allocating memory",
        "Invalid packet size",
        "Error involving Android Memory Dealer",
        "Broken pipe",
        "Error attempting to acquire resource",
        "Invalid state",
        "Invalid format",
        "Bad parameter",
        "Action/command is unsupported",
        "Error reading file",
        "Error involving AFE HAL",
        "Error involving Environment Governor",
        "Error initializing touch processor",
        "Invalid file path",
        "Error parsing parameter",
        "Timeout has occurred",
        "Binder Died",
        "Not enough args",
        "Invalid Arguments",
        "Not Found",
        "Data size exceeds size of buffer",
        "NULL pointer",
        "Index out of bounds",
        "Corrupt data",
};
static_assert(kFirstCode + std::size(kMessages) - 1 == STATUS_CORRUPT_DATA);

}  // namespace

const char* errStr(int code) {
    const uint32_t offset = static_cast<uint32_t>(code) - kFirstCode;
    if (offset < std::size(kMessages)) return kMessages[offset];
    return code == STATUS_NO_ERROR ? "No error" : "Unsupported error code";
}

}  // namespace pemaro
