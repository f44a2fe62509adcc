// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "pemaro/Binder.h"

#include <binder/Parcel.h>

#include <cstdint>
#include <string>
#include <vector>

#include "tools/zelkctl/services/Interfaces.h"

namespace pemaro::zelkctl {

/// What a request without arguments is filled with.
inline void noArguments(android::Parcel&) {}

/// The four services whose interfaces are known.
enum class CheckedService { kCompanion, kTouch, kGesture, kHand };

/// What a call may bring about.
enum class Harm {
    kNone,   ///< it only asks
    kState,  ///< it may change the service's state, or that of its device
};

/// A call that can be checked. A layout has a letter for each field of the reply:
///
///     S  status        i  any int32       u  count, not negative     b  answer, 0 or 1
///     m  map           a  array of maps   p  packet size, above 0, or status
///     B  int32 length, and so many bytes  n  int32 count, and so many C strings
struct CheckedCall {
    uint32_t code;
    const char* name;
    void (*arguments)(android::Parcel& request);
    const char* layout;
    Harm harm;
};

struct CheckedInterface {
    CheckedService service;
    const KnownInterface& known;
    std::vector<CheckedCall> calls;
    const char* word = known.word;
    const char* descriptor = known.descriptor;
    uint32_t lastCode = static_cast<uint32_t>(known.operations.size());
};

/// All four, in the order in which they are checked.
const std::vector<CheckedInterface>& checkedInterfaces();

/// What they are called on the command line.
std::vector<std::string> checkedWords();

/// Whether it is 0 or one of the thirty.
bool isKnownStatus(int32_t status);

/// What is wrong with a reply of this layout; empty when nothing is. The statuses in it are told
/// in `status`, if that is not null.
std::string replyProblem(const android::Parcel& reply, const char* layout,
                         int32_t* status = nullptr);

}  // namespace pemaro::zelkctl
