// SPDX-License-Identifier: Apache-2.0
#pragma once

// Found before the platform's header of this name, makes it that of Android 10, which has no
// `unsecurePointer()` yet.

#include <memory>

#include <binder/IInterface.h>
#include <utils/Errors.h>
#include <utils/RefBase.h>

#define unsecurePointer notYetInAndroid10
#include_next <binder/IMemory.h>
#undef unsecurePointer
