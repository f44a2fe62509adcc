// SPDX-License-Identifier: Apache-2.0
#pragma once

// Found before the platform's header of this name, makes it that of later releases, in which `pointer()`
// is gone and `unsecurePointer()` is in its place.

#include <memory>

#include <binder/IInterface.h>
#include <utils/Errors.h>
#include <utils/RefBase.h>

#define pointer goneWithAndroid12
#include_next <binder/IMemory.h>
#undef pointer
