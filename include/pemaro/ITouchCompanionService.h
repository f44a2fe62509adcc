// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstddef>
#include <string>

#include "pemaro/Binder.h"
#include "pemaro/Export.h"
#include "pemaro/ITouchCompanionClient.h"
#include "pemaro/SerializableMap.h"
#include "pemaro/SerializableMapArray.h"

namespace pemaro {

/// The Binder interface of the touch companion service: recording, configuration, commands,
/// sessions.
///
/// The service is registered with the service manager as "pemaro.TouchService", which is the
/// descriptor too. Every call is one synchronous transaction on the caller's thread. Through a
/// proxy, an operation that returns a status returns
///   - 0x40000000 when the transaction itself failed, whatever the reason, or
///   - the service's own status, unchanged (the exceptions are told at the operation).
/// Both are logged under the tag "ITouchCompanionService".
///
/// The operations stand in the order of their virtual slots, which callers are compiled against.
class ZELK_API ITouchCompanionService : public android::IInterface {
  public:
    DECLARE_META_INTERFACE(TouchCompanionService)

    /// Makes `client` known to the service. A proxy ignores the service's status and returns 0.
    virtual int registerClient(const android::sp<ITouchCompanionClient>& client) = 0;

    /// Forgets the calling process's client. The stub answers with the status as the result of the
    /// transaction, and the driver carries negative results alone: through a proxy this is 0
    /// whatever the service returned, unless the transaction itself failed.
    virtual int unregisterClient() = 0;

    /// Opens the service for the registered client.
    virtual int open() = 0;

    /// Returns the memory that holds the control block and the ring of frames
    /// (TouchCompanionSharedCblk), or null on any failure. The caller shares its ownership.
    virtual android::sp<android::IMemory> getCblk() = 0;

    /// Prepares a recording. A proxy ignores the service's status and returns 0.
    virtual int prepareRecord() = 0;

    /// Starts producing frames.
    virtual int startRecord() = 0;

    /// Stops producing frames.
    virtual int stopRecord() = 0;

    /// Chooses where frames go: 0 is the file of setRecordFile(), 1 the shared memory of getCblk().
    virtual int setRecordParameter(int output) = 0;

    /// Names the file, in the service's file system, that output 0 writes.
    virtual int setRecordFile(const std::string& path) = 0;

    /// Hands an event to the service, which alone knows what `type` and `param` mean.
    virtual int sendEvent(int type, int param) = 0;

    /// Closes what open() opened.
    virtual int close() = 0;

    /// Reads the configuration anew from `path`, or from the service's own place when null.
    virtual int reloadConfig(const std::string* path) = 0;

    /// Writes the configuration to `path`, or to the service's own place when null.
    virtual int saveConfig(const std::string* path) = 0;

    /// Reads the binary configuration into `buffer` of `size` bytes and returns its length in
    /// bytes.
    ///
    /// 0 is any failure. With a `size` of 0 nothing is read: the result is the length that a buffer
    /// needs. Through a proxy, a buffer that is too small stays as it was and yields the length
    /// too: the stub's failure does not cross the driver, what it wrote before does. (Where stub
    /// and proxy meet in one process, it yields 0.) The length that a proxy returns is the
    /// service's word: 32 bits with a sign, so that a negative one becomes one of almost 2^64.
    virtual size_t getConfigParams(void* buffer, size_t size) = 0;

    /// Reads configuration values: `params` names the wanted keys and receives their values. Each
    /// key has a value that is not null, such as 0: a null one has no text, and ends the stub's
    /// process if others follow it.
    virtual int getConfigParams(SerializableMap& params) = 0;

    /// Replaces the binary configuration by the `size` bytes at `data`. A proxy returns 0x4000001A,
    /// without a call, for more bytes than a parcel takes. A stub that finds fewer bytes than
    /// announced, or no memory for them, answers nothing, which a proxy reads as 0.
    virtual int setConfigParams(const void* data, size_t size) = 0;

    /// Fills `out` with the service's properties.
    virtual int getProperties(SerializableMap& out) = 0;

    /// Sends a request map, in which no value is null (see getConfigParams()); `response` receives
    /// the answer when the status is 0.
    virtual int sendCommand(SerializableMap& request, SerializableMap& response) = 0;

    /// Sets parameters of the analog front end.
    virtual int setAFEParams(SerializableMap& params) = 0;

    /// Reads the parameters of the analog front end as one map.
    virtual int getAFEParams(SerializableMap& out) = 0;

    /// Reads the parameters of the analog front end as an array of maps.
    virtual int getAFEParams(SerializableMapArray& out) = 0;

    /// Returns the bytes of a frame; through a proxy 0x40000000 when the transaction failed. A
    /// service that records nothing may return a status, which cannot be told from a size of that
    /// number.
    virtual int getPacketSize() = 0;

    /// Reads the service's inspection word into `*value`, which must not be null.
    virtual int inspect(unsigned int* value) = 0;

    /// Saves the service's state as a session and stores its identifier in `sessionID`.
    virtual int saveSession(int& sessionID) = 0;

    /// Returns the service to the state of a saved session.
    virtual int restoreSession(int sessionID) = 0;

    /// Authenticates the caller; what `auth` holds is the service's business. Never logged.
    virtual int setAuth(const std::string& auth) = 0;
};

}  // namespace pemaro
