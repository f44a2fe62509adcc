// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <fuzzer/FuzzedDataProvider.h>

#include <string>
#include <vector>

#include "pemaro/Binder.h"

namespace pemaro::fuzz {

/// The objects that a parcel may be given: those of the right interface first, then any.
using Binders = std::vector<android::sp<android::IBinder>>;

/// Writes fields until the input tells to stop: numbers, texts, bytes, whole records, and objects out of
/// `binders` (null among them).
void fillParcel(android::Parcel& parcel, FuzzedDataProvider& input, const Binders& binders);

/// Whether a map's or an array's reader that is given a text of this parcel would end the process: a
/// scalar without any text does, by contract, so that such a parcel shows nothing.
bool holdsFatalText(const android::Parcel& parcel);
bool isFatalText(const std::string& text);

/// Reads every byte, so that a sanitizer sees what is no memory of ours.
void touch(const void* data, size_t size);

/// Ends the run, and tells why.
[[noreturn]] void fail(const char* what);
void expect(bool holds, const char* what);

}  // namespace pemaro::fuzz
