// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "pemaro/Export.h"

namespace pemaro {

/// Status codes: what every operation of the library that can fail returns, an `int` that is 0 on
/// success and otherwise one of thirty consecutive codes. The services on the other side of Binder
/// send the same values, so they never change. Each constant is named after its message.
constexpr int STATUS_NO_ERROR = 0;
constexpr int STATUS_UNKNOWN_ERROR = 0x40000000;
constexpr int STATUS_ERROR_OPENING_FILE = 0x40000001;
constexpr int STATUS_ERROR_PARSING_XML = 0x40000002;
constexpr int STATUS_ERROR_PARSING_CONFIGURATION_SETTING = 0x40000003;
constexpr int STATUS_ERROR_WRITING_TO_FILE = 0x40000004;
constexpr int STATUS_INVALID_COMMAND = 0x40000005;
constexpr int STATUS_ERROR_ALLOCATING_MEMORY = 0x40000006;
constexpr int STATUS_INVALID_PACKET_SIZE = 0x40000007;
constexpr int STATUS_ERROR_MEMORY_DEALER = 0x40000008;
constexpr int STATUS_BROKEN_PIPE = 0x40000009;
constexpr int STATUS_ERROR_ACQUIRING_RESOURCE = 0x4000000A;
constexpr int STATUS_INVALID_STATE = 0x4000000B;
constexpr int STATUS_INVALID_FORMAT = 0x4000000C;
constexpr int STATUS_BAD_PARAMETER = 0x4000000D;
constexpr int STATUS_UNSUPPORTED = 0x4000000E;
constexpr int STATUS_ERROR_READING_FILE = 0x4000000F;
constexpr int STATUS_ERROR_AFE_HAL = 0x40000010;
constexpr int STATUS_ERROR_ENVIRONMENT_GOVERNOR = 0x40000011;
constexpr int STATUS_ERROR_INITIALIZING_TOUCH_PROCESSOR = 0x40000012;
constexpr int STATUS_INVALID_FILE_PATH = 0x40000013;
constexpr int STATUS_ERROR_PARSING_PARAMETER = 0x40000014;
constexpr int STATUS_TIMEOUT = 0x40000015;
constexpr int STATUS_BINDER_DIED = 0x40000016;
constexpr int STATUS_NOT_ENOUGH_ARGS = 0x40000017;
constexpr int STATUS_INVALID_ARGUMENTS = 0x40000018;
constexpr int STATUS_NOT_FOUND = 0x40000019;
constexpr int STATUS_DATA_EXCEEDS_BUFFER = 0x4000001A;
constexpr int STATUS_NULL_POINTER = 0x4000001B;
constexpr int STATUS_INDEX_OUT_OF_BOUNDS = 0x4000001C;
constexpr int STATUS_CORRUPT_DATA = 0x4000001D;

/// The English message of a status code, for logs: "No error" for 0, the code's own message for
/// one of the thirty, and "Unsupported error code" for every other number, negative ones included.
/// The text is static: never freed by the caller, valid for the life of the process, readable from
/// any thread.
ZELK_API const char* errStr(int code);

}  // namespace pemaro
