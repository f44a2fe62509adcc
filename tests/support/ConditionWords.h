// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <linux/futex.h>
#include <pthread.h>
#include <sys/syscall.h>
#include <unistd.h>

#include <climits>
#include <cstddef>
#include <cstdint>

namespace pemaro::test {

// What glibc keeps in a condition, for tests of what is left in there by who dies or means ill.
// Another C library keeps other things, bionic's no lock.

constexpr size_t kConditionLock = 32;
constexpr uint32_t kConditionLocked = 1;
constexpr uint32_t kConditionLockStates = 3;
constexpr size_t kConditionFlags = 36;
constexpr uint32_t kConditionMonotonic = 2;
constexpr uint32_t kConditionWaiter = 8;

inline uint32_t* conditionWord(pthread_cond_t& condition, size_t offset) {
    return reinterpret_cast<uint32_t*>(reinterpret_cast<char*>(&condition) + offset);
}

inline void setConditionBits(pthread_cond_t& condition, size_t offset, uint32_t bits) {
    __atomic_fetch_or(conditionWord(condition, offset), bits, __ATOMIC_SEQ_CST);
}

/// As one leaves it who is killed in the last step of its wait: counted as waiting, with the lock.
inline void dieInWait(pthread_cond_t& condition) {
    setConditionBits(condition, kConditionFlags, kConditionWaiter);
    setConditionBits(condition, kConditionLock, kConditionLocked);
}

/// Gives the lock back, whoever held it, and lets those go on who wait for it.
inline void releaseConditionLock(pthread_cond_t& condition) {
    uint32_t* const word = conditionWord(condition, kConditionLock);
    __atomic_fetch_and(word, ~kConditionLockStates, __ATOMIC_SEQ_CST);
    syscall(SYS_futex, word, FUTEX_WAKE, INT_MAX, nullptr, nullptr, 0);
}

}  // namespace pemaro::test
