// SPDX-License-Identifier: Apache-2.0
#include "pemaro/RingWriter.h"

#include <gtest/gtest.h>
#include <unistd.h>

#include <atomic>
#include <cstring>
#include <memory>
#include <string>
#include <thread>

#include "binder/PlatformShims.h"
#include "tests/support/ConditionWords.h"

namespace pemaro::test {

namespace {

// The reader's end of a ring, without its waits.
class Reader {
  public:
    explicit Reader(const RingWriter& writer)
            : block(static_cast<TouchCompanionSharedCblk*>(mappedAddress(writer.memory()))) {}

    std::string take() {
        const uint32_t slot = block->read - block->bufferFrames * block->readWrap;
        const auto* frame = block->frames() + size_t{slot} * block->frameSize;
        std::string text(reinterpret_cast<const char*>(frame));
        block->read += 1;
        if (block->read % block->bufferFrames == 0) {
            block->readWrap += 1;
        }
        return text;
    }

    TouchCompanionSharedCblk* const block;
};

bool put(RingWriter& writer, const std::string& text) {
    return writer.put(text.c_str(), text.size() + 1);
}

}  // namespace

TEST(RingWriter, MakesABlockThatTellsItsGeometry) {
    const std::unique_ptr<RingWriter> writer = RingWriter::create(100, 5);
    ASSERT_NE(nullptr, writer);
    Reader reader(*writer);
    EXPECT_EQ(5u, reader.block->bufferFrames);
    EXPECT_EQ(100u, reader.block->frameSize);
    EXPECT_EQ(120u, reader.block->headerSize);
    EXPECT_EQ(0u, reader.block->read);
    EXPECT_EQ(0u, reader.block->write);
    EXPECT_EQ(136u + 500u, writer->memory()->size());
}

TEST(RingWriter, TakesNoMoreFramesThanTheRingHolds) {
    const std::unique_ptr<RingWriter> writer = RingWriter::create(16, 3);
    Reader reader(*writer);
    EXPECT_TRUE(put(*writer, "a"));
    EXPECT_TRUE(put(*writer, "b"));
    EXPECT_TRUE(put(*writer, "c"));
    EXPECT_FALSE(put(*writer, "d"));
    EXPECT_EQ(3u, reader.block->write);
    EXPECT_EQ("a", reader.take());
    EXPECT_TRUE(put(*writer, "e"));
    EXPECT_FALSE(put(*writer, "f"));
    EXPECT_EQ("b", reader.take());
    EXPECT_EQ("c", reader.take());
    EXPECT_EQ("e", reader.take());
}

TEST(RingWriter, KeepsTheOrderOverManyRounds) {
    const std::unique_ptr<RingWriter> writer = RingWriter::create(16, 7);
    Reader reader(*writer);
    for (int i = 0; i < 1000; i += 5) {
        for (int j = i; j < i + 5; ++j) {
            ASSERT_TRUE(put(*writer, std::to_string(j)));
        }
        for (int j = i; j < i + 5; ++j) {
            ASSERT_EQ(std::to_string(j), reader.take());
        }
    }
    EXPECT_EQ(1000u / 7, reader.block->writeWrap);
}

TEST(RingWriter, RefusesAFrameThatIsLongerThanASlot) {
    const std::unique_ptr<RingWriter> writer = RingWriter::create(16, 2);
    EXPECT_TRUE(put(*writer, std::string(15, 'x')));
    EXPECT_FALSE(put(*writer, std::string(16, 'x')));
}

TEST(RingWriter, LetsAFrameBeFilledInItsSlot) {
    const std::unique_ptr<RingWriter> writer = RingWriter::create(16, 2);
    Reader reader(*writer);
    for (const char* text : {"a", "b"}) {
        uint8_t* const slot = writer->next();
        ASSERT_NE(nullptr, slot);
        EXPECT_EQ(slot, writer->next());
        memcpy(slot, text, 2);
        writer->publish();
    }
    EXPECT_EQ(nullptr, writer->next());
    EXPECT_EQ("a", reader.take());
    EXPECT_EQ(reader.block->frames(), writer->next());
    EXPECT_EQ("b", reader.take());
}

TEST(RingWriter, TakesNothingIntoARingWithoutFrames) {
    const std::unique_ptr<RingWriter> writer = RingWriter::create(16, 0);
    ASSERT_NE(nullptr, writer);
    EXPECT_EQ(nullptr, writer->next());
    EXPECT_FALSE(put(*writer, "a"));
}

TEST(RingWriter, IsNotMadeWithoutTheMemory) {
    EXPECT_EQ(nullptr, RingWriter::create(0xFFFFFFFF, 0xFFFFFFFF));
}

TEST(RingWriter, OutlivedByItsMemory) {
    std::unique_ptr<RingWriter> writer = RingWriter::create(16, 2);
    const android::sp<android::IMemory> memory = writer->memory();
    put(*writer, "a");
    writer.reset();
    const auto* const block = static_cast<const TouchCompanionSharedCblk*>(mappedAddress(memory));
    EXPECT_EQ(1u, block->write);
}

TEST(RingWriter, BelievesNothingThatAClientWritesIntoTheBlock) {
    const std::unique_ptr<RingWriter> writer = RingWriter::create(16, 2);
    Reader reader(*writer);
    reader.block->bufferFrames = 0xFFFFFFFF;
    reader.block->frameSize = 0xFFFFFFFF;
    reader.block->write = 12345;
    reader.block->writeWrap = 12345;
    reader.block->data = nullptr;
    EXPECT_TRUE(put(*writer, "a"));
    EXPECT_EQ(1u, reader.block->write);
    EXPECT_TRUE(put(*writer, "b"));
    // A reader that claims to be ahead of the writer.
    reader.block->read = 3;
    EXPECT_FALSE(put(*writer, "c"));
    reader.block->read = 0x80000000;
    EXPECT_FALSE(put(*writer, "c"));
    reader.block->read = 2;
    EXPECT_TRUE(put(*writer, "c"));
    EXPECT_STREQ("c", reinterpret_cast<char*>(reader.block->frames()));
}

TEST(RingWriter, RemindsUntilEveryFrameIsTaken) {
    const std::shared_ptr<RingWriter> writer = RingWriter::create(16, 2);
    Reader reader(*writer);
    EXPECT_FALSE(writer->remind());
    EXPECT_TRUE(put(*writer, "a"));
    EXPECT_TRUE(put(*writer, "b"));
    EXPECT_TRUE(writer->remind());
    reader.take();
    EXPECT_TRUE(writer->remind());
    reader.take();
    EXPECT_FALSE(writer->remind());
}

TEST(RingWriter, WakesAWaitingReaderWithEachReminder) {
    const std::shared_ptr<RingWriter> writer = RingWriter::create(16, 2);
    Reader reader(*writer);
    EXPECT_TRUE(put(*writer, "a"));
    ASSERT_EQ(0, pthread_mutex_lock(&reader.block->mutex));
    std::atomic<bool> woken{false};
    std::thread reminding([&] {
        while (!woken) {
            EXPECT_TRUE(writer->remind());
            std::this_thread::yield();
        }
    });
    EXPECT_EQ(0, pthread_cond_wait(&reader.block->cond, &reader.block->mutex));
    woken = true;
    reminding.join();
    pthread_mutex_unlock(&reader.block->mutex);
}

TEST(RingWriter, WritesOnWhenTheReaderDiedWithTheMutex) {
    const std::unique_ptr<RingWriter> writer = RingWriter::create(16, 2);
    Reader reader(*writer);
    ASSERT_EQ(0, pthread_mutex_lock(&reader.block->mutex));
    EXPECT_TRUE(put(*writer, "a"));
}

#ifdef __GLIBC__
// What the header warns of: a reader can keep the signal from ending, but not the frame from coming.
TEST(RingWriter, WaitsInItsSignalForTheLockThatADeadReaderTookAlong) {
    const std::unique_ptr<RingWriter> writer = RingWriter::create(16, 2);
    Reader reader(*writer);
    dieInWait(reader.block->cond);
    std::atomic<bool> returned{false};
    std::thread writing([&] {
        EXPECT_TRUE(put(*writer, "a"));
        returned = true;
    });
    while (TouchCompanionSharedCblk::acquireIndex(reader.block->write) == 0) {
        usleep(1000);
    }
    EXPECT_EQ("a", reader.take());
    usleep(50000);
    EXPECT_FALSE(returned);
    releaseConditionLock(reader.block->cond);
    writing.join();
}
#endif

}  // namespace pemaro::test
