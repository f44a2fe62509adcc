// SPDX-License-Identifier: Apache-2.0
#pragma once

// The platform's Binder headers, behind the standard headers that they use without including them
// (the device's own toolchain brings those along).

#include <limits>
#include <memory>
#include <optional>
#include <string>

#include <binder/Binder.h>
#include <binder/IBinder.h>
#include <binder/IInterface.h>
#include <binder/IMemory.h>
#include <binder/Parcel.h>
