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
struct MappedBlock;

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
/// init() that found none). What an operation requires of its caller is looked at first, and the
/// service is missed when it is to be called. Calls may come from several threads, at once too; the
/// client holds no lock while it calls. Log tag: "TouchCompanionClient".
///
/// A service knows a client by its process, and so a process has one recording. While one client of
/// it records, another's setRecordOutput() or startRecord() may be refused, and another's
/// stopRecord() may end the recording of the first. A facade has such a client, too.
///
/// A service may die or misbehave at any point of a recording. The library waits for it in the
/// shared memory for no longer than a second before it gives up on the recording's thread: that is
/// left behind, with an error in the log, when the client stops or is destroyed.
class ZELK_API TouchCompanionClient : public android::RefBase {
  public:
    /// Receives a recorded frame on the client's recording thread: (0, frame, bytes, context).
    /// `frame` lies in the shared ring and is valid until the callback returns; `bytes` is the
    /// length in the frame's own header, the unsigned 32-bit number at byte 8, which the service
    /// alone vouches for. A whole packet at `frame` is mapped, in memory that the service can write
    /// to at any time; a frame that would lie outside of it is delivered as the first byte of the
    /// ring with 0 bytes. The callback may drop the client's last reference, and no frame follows.
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
    /// manager or no such service (after the platform's own lookup gave up, some five seconds);
    /// 0x40000000: registering failed, as it does with a service of another interface, which
    /// refuses the request; else what opening returned. (0x4000000D would be a binder that the
    /// platform makes no proxy for; its releases make one for any.) Not guarded against a second
    /// call, which registers anew.
    ///
    /// In a process that never found a service manager, the platform waits for one without end. It
    /// keeps the one that it found: when that dies and another is started, no client of the process
    /// finds a service any more, and the process has to be restarted.
    int init();

    /// 1 when the service's process answers a ping, else 0.
    int pingService();

    // ---- recording ----

    /// Chooses where the next recording goes: 0 a file of the service's, 1 shared memory. The
    /// client goes by this number from now on, also when the service refuses it, or is not told
    /// because init() was not called yet.
    int setRecordOutput(int output);

    /// Names the file of output 0. 0x4000000D unless output 0 was chosen before.
    int setRecordFile(const std::string& path);

    /// Starts a recording. With output 1 the service's block is mapped and, if there is a data
    /// callback, a thread delivers the frames from before the service starts until stopRecord().
    /// 0x4000000D: setRecordOutput() was never called; 0x4000000A: there can be no thread, or the
    /// service gave no block, or one that is too small, mapped read-only or misaligned, of which
    /// the last two are logged. Nothing of a recording that runs is ended by a failure to begin
    /// another, as far as the service has not ended it.
    int startRecord();

    /// Ends a recording: first the thread, then the service, then the block. It waits for a
    /// callback that runs, however long that takes, and not for a thread whose wait in the shared
    /// memory does not end. Where no frames come it takes up to a second, the time that the thread
    /// looks for one. When the service refuses, its status is returned and the block stays
    /// mapped. From within the callback it only asks the thread to end: who stops or destroys the
    /// client next waits for that callback, and a recording that is started before it returns
    /// delivers nothing until it has.
    int stopRecord();

    /// Does nothing and returns 0.
    int read(void* buffer, unsigned long size);

    /// One pass of delivery: waits for a frame, calls the callback, releases the frame. For the
    /// thread.
    void processData();

    /// Takes up to `buffer->size` bytes of whole frames out of the ring, never across its end.
    /// Waits for frames when the ring is empty; 0x40000015 after about a second without any,
    /// 0x4000000B when no block is mapped. For the recording thread, or for a caller that gave no
    /// callback. What is taken lies in the mapping: it is to be released before stopRecord(), which
    /// ends that.
    int acquireBuffer(FrameBuffer* buffer);

    /// Gives the frames of acquireBuffer() back to the service. Of frames that were taken in an
    /// earlier recording it knows nothing: as many of the present one are skipped.
    void releaseBuffer(FrameBuffer* buffer);

    // ---- commands ----

    /// Sends a command: its name and, each after a space, numbers as strtol() reads them in base 0
    /// ("calibrate 3 0x10"; what is no number counts as 0). Unless the call itself fails, `*result`
    /// receives a text that the caller releases with free(): the service's own, "response success"
    /// when it sent none, or "response failed" together with the status 0x4000000C when the
    /// response could not be read. 0x40000000 for a null `command`; 0x40000006, and a null
    /// `*result`, when the text could not be allocated. `result` must not be null.
    int sendCommand(const char* command, char** result);

    /// Sends a request map as it is and stores the service's answer into `response`. No value in
    /// the request may be null: it has no text, and the service that reads the request is ended by
    /// one that others follow, and does not see one that is the last.
    int sendCommand(SerializableMap& request, SerializableMap& response);

    /// Chooses by the bits of `mask` what recorded frames contain. 0x4000000C when the response
    /// cannot be read; the number in it is only logged.
    int setRecordFilter(unsigned int mask);

    /// Sets a property to a list of numbers, as in sendCommand(). The only property is
    /// "setRollingLogSize"; 0x40000005 for any other name and for a null `name` or `value`.
    int setProperty(const char* name, const char* value);

    /// Reads the value under `key`, "RESPONSE", "RESULTS" of a response: as a number, a map or an
    /// array. 0x4000000C, and `result` as it was, when it is absent or something else.
    int getResultFromResponseCmd(SerializableMap& response, int& result, std::string key);
    int getResultFromResponseCmd(SerializableMap& response, SerializableMap& result,
                                 std::string key);
    int getResultFromResponseCmd(SerializableMap& response, SerializableMapArray& result,
                                 std::string key);

    /// Appends the numbers of a space-separated list to `values` and adds their number to `count`:
    /// one number more than there are spaces. Returns 0. The first character of `text` is taken
    /// without being looked at, so an empty text needs a second NUL.
    int getToolCmdValue(char* text, SerializableMapArray& values, int& count);

    /// Reads `text`, whose first character is taken without being looked at, as one hexadecimal
    /// number. Returns 0.
    int getToolCmdValue(char* text, int& value);

    // ---- configuration, events, sessions ----

    /// Hands an event to the service.
    int sendEvent(eventType type, eventParam param);

    /// Makes the service read its configuration from a file of its own: `*path`, or when null the
    /// one it knows. An empty path is not a null one.
    int reloadConfig(const std::string* path);

    /// Makes the service write its configuration, as reloadConfig() reads it.
    int saveConfig(const std::string* path);

    /// Replaces the service's binary configuration by `size` bytes. 0x4000001A, without a call, for
    /// more than a parcel takes, which is 2^31 - 1 bytes at most; 0x40000000 already for more than
    /// Binder carries, about a megabyte.
    int setConfigParams(const void* data, size_t size);

    /// Reads the binary configuration. `*len` is the capacity of `buffer` in bytes and receives the
    /// configuration's length; with a `*len` of 0 only the length is asked for. 0x4000001B for a
    /// null `len`; 0x40000000, and `*len` as it was, on any failure, a buffer that is too small
    /// among them. With a null `buffer` and enough capacity nothing is copied, and 0 returned. The
    /// length is the service's word, and a negative one becomes one of almost 2^64: who allocates
    /// as much holds it against a limit first. More than a megabyte fits in no answer.
    int getConfigParams(void* buffer, size_t* len);

    /// Reads configuration values: `params` names the wanted keys and receives their values. Each
    /// key needs a value, whatever it is but null: 0 will do, a null one can end the service (see
    /// sendCommand()). A map without entries asks for nothing and succeeds without a call.
    int getConfigParams(SerializableMap& params);

    /// The bytes of a frame, or a status, which cannot be told from a packet size of that number:
    /// 0x40000000 when the call failed, 0x4000000B without a service, or the service's own, such as
    /// 0x4000000E of one that records nothing.
    int getPacketSize();

    /// Reads the service's inspection word into `*value`, which must not be null.
    int inspect(unsigned int* value);

    /// Saves the service's state and stores the session's identifier into `sessionID`.
    int saveSession(int& sessionID);

    /// Returns the service to the state of a saved session.
    int restoreSession(int sessionID);

    /// Authenticates the caller with a text that only the service understands; it must not be null.
    int setAuth(const char* auth);

  protected:
    /// Unregisters from the service, if init() had succeeded, and ends the recording thread, which
    /// takes as long as in stopRecord().
    ~TouchCompanionClient() override;

  private:
    ZELK_LOCAL int mapBlock(ITouchCompanionService& service, MappedBlock& block);
    ZELK_LOCAL MappedBlock mappedBlock() const;
    ZELK_LOCAL int startThread(const MappedBlock& block);
    ZELK_LOCAL void endThread();
    ZELK_LOCAL int readCommandResponse(SerializableMap& response, char** result);

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
