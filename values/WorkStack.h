// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cassert>
#include <cstddef>
#include <cstring>
#include <new>
#include <type_traits>

namespace pemaro {

/// A stack of small records for walks that must not recurse. The first `kInline` of them need no
/// allocation; beyond, the room doubles while it is small, and then grows by half.
template <typename T, size_t kInline>
class WorkStack {
    static_assert(std::is_trivially_copyable_v<T> && std::is_trivially_destructible_v<T>);

  public:
    WorkStack() : mBegin(inlineRoom()), mEnd(mBegin), mLimit(mBegin + kInline) {}
    ~WorkStack() { release(); }
    WorkStack(const WorkStack&) = delete;
    WorkStack& operator=(const WorkStack&) = delete;

    bool empty() const { return mEnd == mBegin; }
    size_t size() const { return static_cast<size_t>(mEnd - mBegin); }
    T* begin() { return mBegin; }
    T* end() { return mEnd; }
    T& operator[](size_t index) {
        assert(index < size());
        return mBegin[index];
    }
    T& top() {
        assert(!empty());
        return mEnd[-1];
    }

    void push(const T& record) {
        if (mEnd == mLimit) grow();
        new (mEnd) T(record);
        ++mEnd;
    }

    T pop() {
        assert(!empty());
        return *--mEnd;
    }

    /// Removes what was pushed last; `size` is not above size().
    void shrink(size_t size) {
        assert(size <= this->size());
        mEnd = mBegin + size;
    }

  private:
    static_assert(kInline >= 2);
    static constexpr size_t kFew = 1024;

    T* inlineRoom() { return reinterpret_cast<T*>(mInline); }

    void release() {
        if (mBegin != inlineRoom()) ::operator delete(mBegin);
    }

    __attribute__((noinline)) void grow() {
        const size_t used = size();
        const size_t capacity = used < kFew ? 2 * used : used + used / 2;
        T* const begin = static_cast<T*>(::operator new(capacity * sizeof(T)));
        memcpy(static_cast<void*>(begin), mBegin, used * sizeof(T));
        release();
        mBegin = begin;
        mEnd = begin + used;
        mLimit = begin + capacity;
    }

    T* mBegin;
    T* mEnd;
    T* mLimit;
    alignas(T) unsigned char mInline[kInline * sizeof(T)];
};

}  // namespace pemaro
