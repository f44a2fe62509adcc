// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "pemaro/Export.h"

#include <string>

/// The pieces of the reader of the text form that are of use by themselves.
/// White space is the six characters space, tab, carriage return, line feed, vertical tab and form
/// feed.
namespace pemaro {

/// The tag of a scalar token, white space around it already removed: VALUE_TYPE_BOOL for `true`,
/// `false` and `null`; VALUE_TYPE_UINT32 when it begins with a minus sign; VALUE_TYPE_STRING when it
/// begins and ends with a double quote; VALUE_TYPE_INT32 when it begins with a point;
/// VALUE_TYPE_FLOAT otherwise. An empty token is fatal.
ZELK_API int findValueType(const std::string& token);

/// Removes white space from both ends of `text`, which stays as it is when there is nothing else in
/// it. Returns 0.
ZELK_API int removeWhitesSpaces(std::string& text);

/// Finds the next key of a map at or after `from`, a NUL-terminated text: skips to a double quote,
/// takes what stands between it and the next double quote that is neither the very next character
/// nor preceded by a backslash, and skips to a colon. Returns 0 with the key and the position of
/// the colon; else logs the failure and returns STATUS_INVALID_FORMAT with both untouched.
ZELK_API int findKey(const char* from, char** colon, std::string& key);

}  // namespace pemaro
