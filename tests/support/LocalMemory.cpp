// SPDX-License-Identifier: Apache-2.0
#include "tests/support/LocalMemory.h"

#include <sys/mman.h>

#include <cstring>
#include <new>

namespace pemaro::test {

class LocalMemory::Heap : public android::BnMemoryHeap {
  public:
    explicit Heap(size_t size) : mBase(::operator new(size)), mSize(size) {
        memset(mBase, 0, size);
    }
    /// Takes a mapping.
    Heap(void* base, size_t size) : mBase(base), mSize(size), mMapped(true) {}

    int getHeapID() const override { return -1; }
    void* getBase() const override { return mBase; }
    size_t getSize() const override { return mSize; }
    uint32_t getFlags() const override { return 0; }
    off_t getOffset() const override { return 0; }

  private:
    ~Heap() override {
        if (!mMapped) {
            ::operator delete(mBase);
        } else if (mBase != MAP_FAILED) {
            munmap(mBase, mSize);
        }
    }

    void* const mBase;
    const size_t mSize;
    const bool mMapped = false;
};

LocalMemory::LocalMemory(size_t size) : LocalMemory(android::sp<Heap>(new Heap(size))) {}

LocalMemory::LocalMemory(const android::sp<Heap>& heap, size_t offset)
        : mHeap(heap), mOffset(offset) {}

LocalMemory::~LocalMemory() = default;

android::sp<LocalMemory> LocalMemory::unmapped() {
    return new LocalMemory(android::sp<Heap>(new Heap(MAP_FAILED, 0)));
}

android::sp<LocalMemory> LocalMemory::readOnly(size_t size) {
    void* base = mmap(nullptr, size, PROT_READ, MAP_PRIVATE | MAP_ANONYMOUS, -1, 0);
    return new LocalMemory(new Heap(base, size));
}

android::sp<LocalMemory> LocalMemory::atOffset(size_t offset, size_t size) {
    return new LocalMemory(new Heap(offset + size), offset);
}

uint8_t* LocalMemory::bytes() const {
    return static_cast<uint8_t*>(mHeap->getBase()) + mOffset;
}

android::sp<android::IMemoryHeap> LocalMemory::getMemory(ssize_t* offset, size_t* size) const {
    if (offset != nullptr) {
        *offset = static_cast<ssize_t>(mOffset);
    }
    if (size != nullptr) {
        *size = mHeap->getSize() - mOffset;
    }
    return mHeap;
}

FrameRing::FrameRing(uint32_t bufferFrames, uint32_t frameSize)
        : mFrameSize(frameSize),
          mBufferFrames(bufferFrames),
          mMemory(new LocalMemory(kTouchCompanionRingOffset + size_t{bufferFrames} * frameSize)),
          mCblk(new (mMemory->bytes()) TouchCompanionSharedCblk) {
    mCblk->bufferFrames = bufferFrames;
    mCblk->frameSize = frameSize;
    mCblk->data = mCblk->frames();
}

uint8_t* FrameRing::slot(uint32_t index) const {
    return mCblk->frames() + size_t{index} * mFrameSize;
}

void FrameRing::setStart(uint32_t number) {
    mCblk->read = number;
    mCblk->write = number;
    mCblk->readWrap = number / mBufferFrames;
    mCblk->writeWrap = number / mBufferFrames;
}

bool FrameRing::put() {
    const uint32_t number = mCblk->write;
    if (number - TouchCompanionSharedCblk::acquireIndex(mCblk->read) >= mBufferFrames) {
        return false;
    }
    uint8_t* frame = slot(number % mBufferFrames);
    for (uint32_t i = 0; i < mFrameSize; ++i) {
        frame[i] = pattern(number, i);
    }
    memcpy(frame, &number, sizeof(number));
    memcpy(frame + 8, &mFrameSize, sizeof(mFrameSize));
    TouchCompanionSharedCblk::publishIndex(mCblk->write, number + 1);
    pthread_cond_signal(&mCblk->cond);
    return true;
}

bool FrameRing::holds(const void* frame, uint32_t number) const {
    const uint8_t* bytes = static_cast<const uint8_t*>(frame);
    if (memcmp(bytes, &number, sizeof(number)) != 0 ||
        memcmp(bytes + 8, &mFrameSize, sizeof(mFrameSize)) != 0) {
        return false;
    }
    for (uint32_t i = 12; i < mFrameSize; ++i) {
        if (bytes[i] != pattern(number, i)) {
            return false;
        }
    }
    return true;
}

uint8_t FrameRing::pattern(uint32_t number, uint32_t offset) const {
    return static_cast<uint8_t>(number * 31 + offset);
}

}  // namespace pemaro::test
