// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "pemaro/Binder.h"

#include <pthread.h>

#include <atomic>
#include <functional>
#include <memory>
#include <mutex>
#include <utility>

#include "pemaro/RingWriter.h"
#include "pemaro/Status.h"

namespace pemaro {

/// The recordings of one client, one after another, for who implements ITouchCompanionService: each
/// has a shared ring of its own, and a thread that writes the frames.
///
///     return mRecorder.prepare(getPacketSize(), 64);                    // in prepareRecord()
///     return mRecorder.memory();                                        // in getCblk()
///     return mRecorder.start([](RingWriter& ring) { ring.put(...); });  // in startRecord()
///     return mRecorder.stop();                                          // in stopRecord()
///
/// Nobody waits for the thread: a client that died in its wait, or means ill, can keep it in the
/// signal of a frame for ever (see RingWriter). A recording belongs to its thread as well, which
/// goes on in memory that it keeps when the recorder has let go of it, or is no more.
///
/// Any thread may call. The class is all in this header.
class RingRecorder {
  public:
    /// Writes the next frame, or waits for it. Called again and again on the thread of the
    /// recording, also while the recorder lets go of it, and once at most behind that; so what it
    /// uses must be its own, or shared.
    using Write = std::function<void(RingWriter& ring)>;

    RingRecorder() = default;

    /// Lets go of the recording.
    ~RingRecorder() { stop(); }
    RingRecorder(const RingRecorder&) = delete;
    RingRecorder& operator=(const RingRecorder&) = delete;

    /// Ends the last recording, which a client that died has left running, and makes the ring of the
    /// next one, as RingWriter::create() does; 0, or 0x40000006 when there is no memory for it.
    int prepare(uint32_t frameBytes, uint32_t ringFrames) {
        stop();
        auto next = std::make_shared<Recording>();
        next->ring = RingWriter::create(frameBytes, ringFrames);
        if (next->ring == nullptr) {
            return STATUS_ERROR_ALLOCATING_MEMORY;
        }
        // Two that are prepared at once leave one.
        exchange(next);
        return STATUS_NO_ERROR;
    }

    /// The ring's memory; null when none is prepared.
    android::sp<android::IMemory> memory() const {
        const std::lock_guard<std::mutex> guard(mLock);
        return mRecording != nullptr ? mRecording->ring->memory() : nullptr;
    }

    /// Begins to write; 0, or 0x4000000D for an empty function, 0x4000000B when no ring is prepared
    /// or the recording has begun, or 0x4000000A when there is no thread to be had. The function is
    /// destroyed with no lock held: by its thread, or by who stops it when that ends first.
    int start(Write write) {
        if (!write) {
            return STATUS_BAD_PARAMETER;
        }
        const std::lock_guard<std::mutex> guard(mLock);
        if (mRecording == nullptr || mRecording->write) {
            return STATUS_INVALID_STATE;
        }
        mRecording->write.swap(write);  // which is empty then, or takes it back
        auto shared = std::make_unique<std::shared_ptr<Recording>>(mRecording);
        pthread_t thread;
        if (pthread_create(&thread, nullptr, run, shared.get()) != 0) {
            mRecording->write.swap(write);
            return STATUS_ERROR_ACQUIRING_RESOURCE;
        }
        pthread_detach(thread);
        static_cast<void>(shared.release());
        return STATUS_NO_ERROR;
    }

    /// Tells the thread to end, without waiting, and lets go of the recording; 0, also when there
    /// is none.
    int stop() {
        exchange(nullptr);
        return STATUS_NO_ERROR;
    }

  private:
    struct Recording {
        std::unique_ptr<RingWriter> ring;
        Write write;
        std::atomic<bool> stopped{false};
    };

    static void* run(void* argument) {
        const std::unique_ptr<std::shared_ptr<Recording>> shared(
                static_cast<std::shared_ptr<Recording>*>(argument));
        Recording& recording = **shared;
        while (!recording.stopped) {
            recording.write(*recording.ring);
        }
        return nullptr;
    }

    /// What the last recording's function has captured may ask the recorder when it is destroyed.
    void exchange(std::shared_ptr<Recording> recording) {
        {
            const std::lock_guard<std::mutex> guard(mLock);
            mRecording.swap(recording);
        }
        if (recording != nullptr) {
            recording->stopped = true;
        }
    }

    mutable std::mutex mLock;
    std::shared_ptr<Recording> mRecording;
};

}  // namespace pemaro
