// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <utils/RefBase.h>

#include <cstddef>
#include <cstdint>
#include <string>

#include "pemaro/Binder.h"
#include "pemaro/BnTouchCompanionClient.h"
#include "pemaro/Export.h"
#include "pemaro/ITouchCompanionService.h"
#include "pemaro/SerializableMap.h"
#include "pemaro/SerializableMapArray.h"
#include "pemaro/TouchCompanionSharedCblk.h"

namespace pemaro {

class TouchCompanionThread;

/// Kinds and parameters of TouchCompanionClient::sendEvent(); the service alone defines their
/// values.
enum eventType : int32_t {};
enum eventParam : int32_t {};

/// A caller's handle on the touch companion service: connects to it, records touch frames, and
/// sends it commands, configuration, events and sessions.
///
/// Reference-counted: hold it in an `android::sp`. Recording, from start to end:
///
///     void onFrame(int, void* frame, unsigned long bytes, void* context);
///
///     android::sp<TouchCompanionClient> client = new TouchCompanionClient(onFrame, context);
///     int status = client->init();
///     if (status == 0) status = client->setRecordOutput(1);
///     if (status == 0) status = client->startRecord();  // onFrame runs on the client's own thread
///     ...
///     client->stopRecord();                             // returns after the last onFrame
///
/// Every operation is one synchronous Binder call on the caller's thread unless told otherwise, and
/// returns a status of Status.h: 0, the service's own status unchanged, 0x40000000 when the
/// transaction failed, or 0x4000000B when the client holds no service (before init(), or after an
/// init() that found none). The client takes no lock: calls may come from several threads, but
/// init(), startRecord(), stopRecord() and destruction exclude one another. Log tag:
/// "TouchCompanionClient".
class ZELK_API TouchCompanionClient : public android::RefBase {
  public:
    /// Receives a recorded frame on the client's recording thread: (0, frame, bytes, context).
    /// `frame` lies in the shared ring and is valid until the callback returns; `bytes` is the
    /// length in the frame's own header, the unsigned 32-bit number at byte 8. The callback must
    /// not stop the recording or drop the client's last reference.
    using DataCallback = void (*)(int, void*, unsigned long, void*);

    /// A contiguous run of frames in the ring.
    struct FrameBuffer {
        void* data;           ///< first frame of the run
        size_t size;          ///< in: bytes wanted; out: bytes of the run
        uint32_t frameCount;  ///< out: frames in the run
    };

    /// What the client registers with the service as its identity; it has no behaviour of its own.
    class BinderHandle : public BnTouchCompanionClient {};

    /// A client without a data callback: a recording to shared memory then runs without a thread.
    TouchCompanionClient();
    /// `context` stays the caller's and is passed back unchanged with every frame.
    TouchCompanionClient(DataCallback callback, void* context);

    /// Looks the service up, registers this client and opens the service. 0x4000000A: no service
    /// manager or no such service (after the platform's own lookup gave up); 0x4000000D: the binder
    /// found is no touch companion service; else what registering or opening returned. Not guarded
    /// against a second call, which registers anew.
    int init();

    /// 1 when the service's process answers a ping, else 0.
    int pingService();

    // ---- recording ----

    /// Chooses where the next recording goes: 0 a file of the service's, 1 shared memory.
    int setRecordOutput(int output);

    /// Names the file of output 0. 0x4000000D unless output 0 was chosen before.
    int setRecordFile(const std::string& path);

    /// Starts a recording. With output 1 the service's block is mapped and, if there is a data
    /// callback, a thread delivers the frames from before the service starts until stopRecord().
    /// 0x4000000D: no output was chosen; 0x4000000A: the service gave no usable block.
    int startRecord();

    /// Ends a recording: first the thread, then the service, then the block. When the service
    /// refuses, its status is returned and the block stays mapped.
    int stopRecord();

    /// Does nothing and returns 0.
    int read(void* buffer, unsigned long size);

    /// One pass of delivery: waits for a frame, calls the callback, releases the frame. For the
    /// thread.
    void processData();

    /// Takes up to `buffer->size` bytes of whole frames out of the ring, never across its end.
    /// Waits for frames when the ring is empty; 0x40000015 after about a second without any,
    /// 0x4000000B when no block is mapped. For the recording thread, or for a caller that gave no
    /// callback.
    int acquireBuffer(FrameBuffer* buffer);

    /// Gives the frames of acquireBuffer() back to the service.
    void releaseBuffer(FrameBuffer* buffer);

  protected:
    /// Unregisters from the service and ends the recording thread, if init() had succeeded.
    ~TouchCompanionClient() override;

  private:
    int mapBlock();
    void startThread();
    void endThread();
    int waitForFrames(uint32_t& write, uint32_t& available);
    uint32_t frameLength(const void* frame) const;
    void countFrame();

    bool mInitialized = false;
    android::sp<TouchCompanionThread> mThread;
    android::sp<ITouchCompanionService> mService;
    android::sp<android::IMemory> mCblkMemory;
    TouchCompanionSharedCblk* mCblk = nullptr;
    DataCallback mCallback;
    void* mContext;
    int32_t mRecordOutput;
    uint32_t mFrameCount = 0;
    int64_t mStartTime = 0;
    uint32_t mLastSecond = 0;
    android::sp<BinderHandle> mBinderHandle;
};

}  // namespace pemaro
