// SPDX-License-Identifier: Apache-2.0
#include "pemaro/TouchCompanionSharedCblk.h"

#include <gtest/gtest.h>
#include <sys/mman.h>
#include <sys/wait.h>
#include <time.h>
#include <unistd.h>

#include <cerrno>
#include <cstring>
#include <new>

namespace pemaro::test {
namespace {

// A page that parent and child of a fork share, with a block and a word of the test's own.
class SharedPage {
  public:
    SharedPage()
            : mPage(mmap(nullptr, kSize, PROT_READ | PROT_WRITE, MAP_SHARED | MAP_ANONYMOUS, -1,
                         0)) {
        memset(mPage, 0xa5, kSize);
        mBlock = new (mPage) TouchCompanionSharedCblk;
        mWord = new (mBlock->frames()) uint32_t(0);
    }
    ~SharedPage() { munmap(mPage, kSize); }

    TouchCompanionSharedCblk& block() const { return *mBlock; }
    uint32_t& word() const { return *mWord; }

    template <typename T>
    T at(size_t offset) const {
        T value;
        memcpy(&value, static_cast<const uint8_t*>(mPage) + offset, sizeof(value));
        return value;
    }

  private:
    static constexpr size_t kSize = 4096;
    void* const mPage;
    TouchCompanionSharedCblk* mBlock;
    uint32_t* mWord;
};

// Leaves ones where the next function has its variables.
__attribute__((noinline)) void soilTheStack() {
    volatile uint8_t bytes[2048];
    for (size_t i = 0; i < sizeof(bytes); ++i) {
        bytes[i] = 0xff;
    }
}

__attribute__((noinline)) void makeBlock(void* at) {
    new (at) TouchCompanionSharedCblk;
}

// Runs `child` in a process of its own.
template <typename Child>
pid_t inChild(Child child) {
    const pid_t pid = fork();
    if (pid == 0) {
        _exit(child());
    }
    return pid;
}

int exitStatusOf(pid_t pid) {
    int status = 0;
    EXPECT_EQ(pid, waitpid(pid, &status, 0));
    return WIFEXITED(status) ? WEXITSTATUS(status) : -1;
}

timespec inSeconds(int seconds) {
    timespec deadline;
    clock_gettime(CLOCK_REALTIME, &deadline);
    deadline.tv_sec += seconds;
    return deadline;
}

TEST(TouchCompanionSharedCblk, StartsEmpty) {
    const SharedPage page;
    EXPECT_EQ(0u, page.at<uint32_t>(88)) << "read";
    EXPECT_EQ(0u, page.at<uint32_t>(92)) << "write";
    EXPECT_EQ(0u, page.at<uint32_t>(96)) << "readWrap";
    EXPECT_EQ(0u, page.at<uint32_t>(100)) << "writeWrap";
    EXPECT_EQ(0u, page.at<uint64_t>(104)) << "data";
    EXPECT_EQ(120u, page.at<uint32_t>(120)) << "headerSize";
    EXPECT_EQ(0u, page.at<uint32_t>(124)) << "bufferFrames";
    EXPECT_EQ(0u, page.at<uint32_t>(128)) << "frameSize";
}

TEST(TouchCompanionSharedCblk, HasItsFieldsWhereTheOtherSideLooks) {
    const SharedPage page;
    TouchCompanionSharedCblk& block = page.block();
    block.read = 1;
    block.write = 2;
    block.readWrap = 3;
    block.writeWrap = 4;
    block.data = block.frames();
    block.bufferFrames = 5;
    block.frameSize = 6;
    EXPECT_EQ(1u, page.at<uint32_t>(88));
    EXPECT_EQ(2u, page.at<uint32_t>(92));
    EXPECT_EQ(3u, page.at<uint32_t>(96));
    EXPECT_EQ(4u, page.at<uint32_t>(100));
    EXPECT_EQ(reinterpret_cast<uint8_t*>(&block) + 136, page.at<uint8_t*>(104));
    EXPECT_EQ(5u, page.at<uint32_t>(124));
    EXPECT_EQ(6u, page.at<uint32_t>(128));
    EXPECT_EQ(reinterpret_cast<uint8_t*>(&block), reinterpret_cast<uint8_t*>(&block.mutex));
    EXPECT_EQ(reinterpret_cast<uint8_t*>(&block) + 40, reinterpret_cast<uint8_t*>(&block.cond));
}

// The attributes of both are made from nothing, whatever lay in their place.
TEST(TouchCompanionSharedCblk, MakesTheSameMutexAndConditionEachTime) {
    alignas(TouchCompanionSharedCblk) uint8_t first[sizeof(TouchCompanionSharedCblk)] = {};
    alignas(TouchCompanionSharedCblk) uint8_t second[sizeof(TouchCompanionSharedCblk)] = {};
    makeBlock(first);
    soilTheStack();
    makeBlock(second);
    EXPECT_EQ(0, memcmp(first, second, offsetof(TouchCompanionSharedCblk, read)));
}

TEST(TouchCompanionSharedCblk, ExcludesTheOtherProcess) {
    const SharedPage page;
    TouchCompanionSharedCblk& block = page.block();
    ASSERT_EQ(0, pthread_mutex_lock(&block.mutex));
    EXPECT_EQ(EBUSY, exitStatusOf(inChild([&] { return pthread_mutex_trylock(&block.mutex); })));

    // A waiter in the other process is woken by this one's unlock.
    const pid_t waiter = inChild([&] {
        __atomic_store_n(&page.word(), 1, __ATOMIC_RELEASE);
        const timespec deadline = inSeconds(60);
        return pthread_mutex_timedlock(&block.mutex, &deadline);
    });
    while (__atomic_load_n(&page.word(), __ATOMIC_ACQUIRE) == 0) {
        usleep(1000);
    }
    usleep(20000);  // let it come to rest in the lock; the test holds without, too
    pthread_mutex_unlock(&block.mutex);
    EXPECT_EQ(0, exitStatusOf(waiter));
}

TEST(TouchCompanionSharedCblk, WakesAWaiterInTheOtherProcess) {
    const SharedPage page;
    TouchCompanionSharedCblk& block = page.block();
    const pid_t waiter = inChild([&] {
        pthread_mutex_lock(&block.mutex);
        page.word() = 1;
        const timespec deadline = inSeconds(60);
        int result = 0;
        while (page.word() != 2 && result == 0) {
            result = pthread_cond_timedwait(&block.cond, &block.mutex, &deadline);
        }
        pthread_mutex_unlock(&block.mutex);
        return result;
    });
    // The child holds the mutex from before it sets the word until it waits.
    for (bool waiting = false; !waiting;) {
        pthread_mutex_lock(&block.mutex);
        waiting = page.word() == 1;
        if (waiting) {
            page.word() = 2;
            pthread_cond_signal(&block.cond);
        }
        pthread_mutex_unlock(&block.mutex);
        usleep(1000);
    }
    EXPECT_EQ(0, exitStatusOf(waiter)) << "ETIMEDOUT: the signal stayed in its own process";
}

}  // namespace
}  // namespace pemaro::test
