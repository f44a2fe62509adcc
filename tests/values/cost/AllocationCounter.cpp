// SPDX-License-Identifier: Apache-2.0

// The C library's allocator, with a count in front. Everything else that allocates, operator new and the
// platform's shared buffers among it, ends here.

#include "tests/values/cost/AllocationCounter.h"

#include <malloc.h>

#include <algorithm>

extern "C" {
void* __libc_malloc(size_t size);
void* __libc_realloc(void* block, size_t size);
void* __libc_calloc(size_t count, size_t size);
void __libc_free(void* block);
}

namespace pemaro::test {

namespace {

thread_local bool tCounting = false;
thread_local Allocations tCounted;

void* countAllocated(void* block) {
    if (tCounting && block != nullptr) {
        ++tCounted.count;
        tCounted.heldBytes += malloc_usable_size(block);
        tCounted.peakBytes = std::max(tCounted.peakBytes, tCounted.heldBytes);
    }
    return block;
}

void countFreed(void* block) {
    if (tCounting && block != nullptr) tCounted.heldBytes -= malloc_usable_size(block);
}

}  // namespace

void startCounting() {
    tCounted = Allocations();
    tCounting = true;
}

Allocations stopCounting() {
    tCounting = false;
    return tCounted;
}

}  // namespace pemaro::test

extern "C" {

void* malloc(size_t size) {
    return pemaro::test::countAllocated(__libc_malloc(size));
}

void* calloc(size_t count, size_t size) {
    return pemaro::test::countAllocated(__libc_calloc(count, size));
}

void* realloc(void* block, size_t size) {
    pemaro::test::countFreed(block);
    return pemaro::test::countAllocated(__libc_realloc(block, size));
}

void free(void* block) {
    pemaro::test::countFreed(block);
    __libc_free(block);
}
}
