// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <pthread.h>

#include <utility>

namespace pemaro {

// The members of clients that operations, events and death notices share: a caller's thread may
// replace what a Binder thread is about to use. Whoever needs a member copies it, and keeps the
// copy for as long as it is used. The copy is made under one guard for the whole process, since the
// classes have no room for one of their own; it is held for the copy alone and never during a call.

/// Holds the guard while it lives.
class ClientGuard {
  public:
    ClientGuard();
    ~ClientGuard();
    ClientGuard(const ClientGuard&) = delete;
    ClientGuard& operator=(const ClientGuard&) = delete;
};

template <typename Member>
Member copyGuarded(const Member& member) {
    ClientGuard guard;
    return member;
}

/// Returns what was held before, so that it is let go, if it is, outside the guard.
template <typename Member>
Member exchangeGuarded(Member& member, Member value) {
    ClientGuard guard;
    std::swap(member, value);
    return value;
}

}  // namespace pemaro
