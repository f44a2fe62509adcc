// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "tools/zelkctl/trace/ProcessNames.h"
#include "tools/zelkctl/trace/TracedCall.h"

namespace pemaro::zelkctl {

/// A call of touch.isSupported that took 0.5 ms, of which the service worked 0.2 ms.
inline TracedCall someCall() {
    TracedCall call;
    call.interface = &knownService("touch");
    call.code = 3;
    call.number = 53;
    call.end = CallEnd::kAnswered;
    call.sent = 1'100'000'000;
    call.received = 1'100'100'000;
    call.replied = 1'100'300'000;
    call.returned = 1'100'500'000;
    call.fromProcess = 146;
    call.fromThread = 147;
    call.toProcess = 137;
    call.toThread = 143;
    call.requestBytes = 56;
    call.replyBytes = 8;
    return call;
}

/// The same without an answer.
inline TracedCall openCall() {
    TracedCall call = someCall();
    call.end = CallEnd::kOpen;
    call.received = call.replied = call.returned = 0;
    call.fromProcess = call.toThread = 0;
    call.replyBytes = 0;
    return call;
}

inline Party someCaller() {
    return {146, 147, "zelkctl"};
}

inline Party someCallee() {
    return {137, 143, "zelk-touchstack"};
}

}  // namespace pemaro::zelkctl
