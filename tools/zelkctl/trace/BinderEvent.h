// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstdint>

namespace pemaro::zelkctl {

/// What the kernel's Binder driver tells of one step of a transaction, at the moment and on the thread
/// that it happens on. Requests and replies are transactions alike, each with a number of its own.
///
///     caller                            service
///     kSent, kBuffer, kNode…
///                                       kReceived
///                                       … works …
///                                       kSent (a reply), kBuffer, kNode…
///     kReceived
struct BinderEvent {
    enum class Kind {
        kSent,      ///< all but size, object and command
        kReceived,  ///< the number
        kBuffer,    ///< number and size: there is room for it where it goes
        kNode,      ///< number and object: it hands an object over
        kReturn,    ///< the command: what the driver tells a thread in place of a reply
    };
    Kind kind = Kind::kSent;
    int64_t time = 0;  ///< monotonic nanoseconds
    int thread = 0;
    int number = 0;
    int object = 0;    ///< the object that is called, or handed over
    int process = 0;   ///< where it goes
    int toThread = 0;  ///< of a reply and of a nested call; 0: any
    bool isReply = false;
    uint32_t code = 0;
    uint32_t flags = 0;
    uint64_t size = 0;
    uint32_t command = 0;
};

}  // namespace pemaro::zelkctl
