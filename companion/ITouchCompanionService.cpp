// SPDX-License-Identifier: Apache-2.0
// The touch companion service's transactions, both sides: first the codes and the texts of each
// operation, then the proxy, the meta-interface and the stub. docs/binder-protocol.md lists the
// parcels.

#define LOG_TAG "ITouchCompanionService"

#include "pemaro/ITouchCompanionService.h"

#include <log/log.h>

#include <algorithm>
#include <cstdlib>
#include <limits>
#include <memory>

#include "binder/ParcelText.h"
#include "binder/ProxyCall.h"
#include "binder/StubDispatch.h"
#include "pemaro/BnTouchCompanionService.h"
#include "pemaro/BpTouchCompanionService.h"
#include "pemaro/Status.h"

namespace pemaro {

using android::IBinder;
using android::IInterface;
using android::IMemory;
using android::NO_ERROR;
using android::Parcel;
using android::sp;
using android::status_t;

namespace {

enum {
    REGISTER_CLIENT = IBinder::FIRST_CALL_TRANSACTION,
    UNREGISTER_CLIENT,
    OPEN,
    GET_CBLK,
    PREPARE_RECORD,
    START_RECORD,
    STOP_RECORD,
    SET_RECORD_FILE,
    SEND_EVENT,
    CLOSE,
    RELOAD_CONFIG,
    RELOAD_CONFIG_PATH,
    SET_RECORD_PARAMETER,
    GET_PROPERTIES,
    GET_AFE_PARAMS,
    SET_AFE_PARAMS,
    GET_AFE_PARAMS_ARRAY,
    SAVE_CONFIG,
    SAVE_CONFIG_PATH,
    GET_PACKET_SIZE,
    SET_CONFIG_BINARY,
    GET_CONFIG_BINARY,
    INSPECT,
    GET_CONFIG,
    SEND_COMMAND,
    SAVE_SESSION,
    RESTORE_SESSION,
    SET_AUTH,
    END_OF_CODES,  // stays the last
};

// Several texts name another operation than their own ("init()" of open and close, "reloadConfig()"
// of sendEvent, "setRecordOutput()" of setRecordParameter), unregisterClient's entry has a colon
// and a blank, setRecordFile has no entry and setAuth no text at all. Log readers know them so;
// they stay.
constexpr ProxyRow kRegisterClient = {REGISTER_CLIENT, "Bp::registerClient",
                                      "registerClient() error: %s"};
constexpr ProxyRow kUnregisterClient = {UNREGISTER_CLIENT, "Bp: unregisterClient",
                                        "unregisterClient() error: %s"};
constexpr ProxyRow kOpen = {OPEN, "Bp::open", "init() error: %s", "init() error: %s"};
constexpr ProxyRow kGetCblk = {GET_CBLK, "Bp::getCblk", "getCblk() error: %s"};
constexpr ProxyRow kPrepareRecord = {PREPARE_RECORD, "Bp::prepareRecord",
                                     "prepareRecord() error: %s"};
constexpr ProxyRow kStartRecord = {START_RECORD, "Bp::startRecord", "startRecord() error: %s",
                                   "startRecord() error: %s"};
constexpr ProxyRow kStopRecord = {STOP_RECORD, "Bp::stopRecord", "stopRecord() error: %s",
                                  "stopRecord() error: %s"};
constexpr ProxyRow kSetRecordFile = {SET_RECORD_FILE, nullptr, "setRecordFile() error: %s",
                                     "setRecordFile() error: %s"};
constexpr ProxyRow kSendEvent = {SEND_EVENT, "Bp::sendEvent", "sendEvent() error: %s",
                                 "reloadConfig() error: %s"};
constexpr ProxyRow kClose = {CLOSE, "Bp::close", "init() error: %s", "close() error: %s"};
constexpr ProxyRow kReloadConfig = {RELOAD_CONFIG, "Bp::reloadConfig", "reloadConfig() error: %s",
                                    "reloadConfig() error: %s"};
constexpr ProxyRow kReloadConfigPath = {RELOAD_CONFIG_PATH, kReloadConfig.entry,
                                        kReloadConfig.transportError, kReloadConfig.remoteError};
constexpr ProxyRow kSetRecordParameter = {SET_RECORD_PARAMETER, "Bp::setRecordParameter",
                                          "setRecordParameter() error: %s",
                                          "setRecordOutput() error: %s"};
constexpr ProxyRow kGetProperties = {GET_PROPERTIES, "Bp::getProperties",
                                     "getProperties() error: %s", "getProperties() error: %s"};
constexpr ProxyRow kGetAFEParams = {GET_AFE_PARAMS, "Bp::getAFEParams", "getAFEParams() error: %s",
                                    "getAFEParams() error: %s"};
constexpr ProxyRow kSetAFEParams = {SET_AFE_PARAMS, "Bp::setAFEParams", "setAFEParams() error: %s",
                                    "setAFEParams() error: %s"};
constexpr ProxyRow kGetAFEParamsArray = {GET_AFE_PARAMS_ARRAY, kGetAFEParams.entry,
                                         kGetAFEParams.transportError, kGetAFEParams.remoteError};
constexpr ProxyRow kSaveConfig = {SAVE_CONFIG, "Bp::saveConfig", "saveConfig() error: %s",
                                  "saveConfig() error: %s"};
constexpr ProxyRow kSaveConfigPath = {SAVE_CONFIG_PATH, kSaveConfig.entry,
                                      kSaveConfig.transportError, kSaveConfig.remoteError};
constexpr ProxyRow kGetPacketSize = {GET_PACKET_SIZE, "Bp::getPacketSize",
                                     "getPacketSize() error: %s"};
constexpr ProxyRow kSetConfigBinary = {SET_CONFIG_BINARY, "Bp::setConfigParams(binary)",
                                       "setConfigParams() (binary) error: %s",
                                       "setConfigParams() (binary) error: %s"};
constexpr ProxyRow kGetConfigBinary = {GET_CONFIG_BINARY, "Bp::getConfigParams (binary)",
                                       "getConfigParams() (binary) error: %s"};
constexpr ProxyRow kInspect = {INSPECT, "Bp::inspect", "inspect() error: %s",
                               "inspect() error: %s"};
constexpr ProxyRow kGetConfig = {GET_CONFIG, "Bp::getConfigParams",
                                 "getConfigParams() transact error: %s",
                                 "getConfigParams() reply error: %s"};
constexpr ProxyRow kSendCommand = {SEND_COMMAND, "Bp::sendCommand", "sendCommand() error: %s",
                                   "sendCommand() error1: %s"};
constexpr ProxyRow kSaveSession = {SAVE_SESSION, "Bp::saveSession", "saveSession() error: %s",
                                   "saveSession() error: %s"};
constexpr ProxyRow kRestoreSession = {RESTORE_SESSION, "Bp::restoreSession",
                                      "restoreSession() error: %s", "restoreSession() error: %s"};
constexpr ProxyRow kSetAuth = {SET_AUTH, nullptr, nullptr};

}  // namespace

// ---- proxy ----

namespace {

struct Call : ProxyCall {
    explicit Call(const ProxyRow& row)
            : ProxyCall(LOG_TAG, row, ITouchCompanionService::descriptor) {}
};

// For the operations that answer with a status and, if that is 0, the text of a map or array. A
// text that cannot be read leaves `out` as it was; it is shown where `textLog` is a format for it.
template <typename Container>
int callForText(Call& call, IBinder* remote, Container& out, const char* parseError,
                const char* textLog = nullptr) {
    int status = call.transactForStatus(remote);
    if (status != STATUS_NO_ERROR) {
        return status;
    }
    std::string text = readText(call.reply);
    status = out.unserialize(text);
    if (status != STATUS_NO_ERROR) {
        ALOGE(parseError, errStr(status));
        if (textLog != nullptr) {
            ALOGE(textLog, text.c_str());
        }
    }
    return status;
}

}  // namespace

BpTouchCompanionService::BpTouchCompanionService(const sp<IBinder>& remote)
        : BpInterface<ITouchCompanionService>(remote) {}

int BpTouchCompanionService::registerClient(const sp<ITouchCompanionClient>& client) {
    Call call(kRegisterClient);
    call.writeObject(client);
    return call.transact(remote());
}

int BpTouchCompanionService::unregisterClient() {
    Call call(kUnregisterClient);
    return call.transact(remote());
}

int BpTouchCompanionService::open() {
    Call call(kOpen);
    return call.transactForStatus(remote());
}

sp<IMemory> BpTouchCompanionService::getCblk() {
    Call call(kGetCblk);
    if (call.transact(remote()) != STATUS_NO_ERROR) {
        return nullptr;
    }
    return IMemory::asInterface(call.reply.readStrongBinder());
}

int BpTouchCompanionService::prepareRecord() {
    Call call(kPrepareRecord);
    return call.transact(remote());
}

int BpTouchCompanionService::startRecord() {
    Call call(kStartRecord);
    return call.transactForStatus(remote());
}

int BpTouchCompanionService::stopRecord() {
    Call call(kStopRecord);
    return call.transactForStatus(remote());
}

int BpTouchCompanionService::setRecordParameter(int output) {
    Call call(kSetRecordParameter);
    call.request.writeInt32(output);
    return call.transactForStatus(remote());
}

int BpTouchCompanionService::setRecordFile(const std::string& path) {
    Call call(kSetRecordFile);
    writeText(call.request, path);
    return call.transactForStatus(remote());
}

int BpTouchCompanionService::sendEvent(int type, int param) {
    Call call(kSendEvent);
    call.request.writeInt32(type);
    call.request.writeInt32(param);
    return call.transactForStatus(remote());
}

int BpTouchCompanionService::close() {
    Call call(kClose);
    return call.transactForStatus(remote());
}

int BpTouchCompanionService::reloadConfig(const std::string* path) {
    Call call(path == nullptr ? kReloadConfig : kReloadConfigPath);
    if (path != nullptr) {
        writeText(call.request, *path);
    }
    return call.transactForStatus(remote());
}

int BpTouchCompanionService::saveConfig(const std::string* path) {
    Call call(path == nullptr ? kSaveConfig : kSaveConfigPath);
    if (path != nullptr) {
        writeText(call.request, *path);
    }
    return call.transactForStatus(remote());
}

size_t BpTouchCompanionService::getConfigParams(void* buffer, size_t size) {
    Call call(kGetConfigBinary);
    call.request.writeInt32(static_cast<int32_t>(size));
    if (call.transact(remote()) != STATUS_NO_ERROR) {
        return 0;
    }
    size_t length = static_cast<size_t>(call.reply.readInt32());
    if (length == 0) {
        ALOGE("getConfigParams: Error! unable to get binary config params.");
        return 0;
    }
    if (size == 0) {
        return length;
    }
    if (length > size) {
        ALOGE("getConfigParams: Error! buffer must be at least %zu bytes", length);
        return length;
    }
    if (buffer == nullptr) {
        ALOGE("getConfigParams: Error! buffer is null!");
        return length;
    }
    status_t status = call.reply.read(buffer, length);
    if (status != NO_ERROR) {
        ALOGE(kGetConfigBinary.transportError, transportText(status));
        return 0;
    }
    return length;
}

int BpTouchCompanionService::getConfigParams(SerializableMap& params) {
    Call call(kGetConfig);
    writeText(call.request, params.serialize());
    return callForText(call, remote(), params, "getConfigParams() unserialize error: %s",
                       "string: %s");
}

int BpTouchCompanionService::setConfigParams(const void* data, size_t size) {
    Call call(kSetConfigBinary);
    call.request.writeInt32(static_cast<int32_t>(size));
    // A parcel that refuses bytes may say so, or only leave them out.
    const size_t begin = call.request.dataPosition();
    if (size > std::numeric_limits<int32_t>::max() || call.request.write(data, size) != NO_ERROR ||
        call.request.dataPosition() - begin < size) {
        ALOGE(kSetConfigBinary.remoteError, errStr(STATUS_DATA_EXCEEDS_BUFFER));
        return STATUS_DATA_EXCEEDS_BUFFER;
    }
    return call.transactForStatus(remote());
}

int BpTouchCompanionService::getProperties(SerializableMap& out) {
    Call call(kGetProperties);
    return callForText(call, remote(), out, kGetProperties.remoteError);
}

int BpTouchCompanionService::sendCommand(SerializableMap& request, SerializableMap& response) {
    Call call(kSendCommand);
    writeText(call.request, request.serialize());
    return callForText(call, remote(), response, "sendCommand() error2: %s");
}

int BpTouchCompanionService::setAFEParams(SerializableMap& params) {
    Call call(kSetAFEParams);
    writeText(call.request, params.serialize());
    return call.transactForStatus(remote());
}

int BpTouchCompanionService::getAFEParams(SerializableMap& out) {
    Call call(kGetAFEParams);
    return callForText(call, remote(), out, kGetAFEParams.remoteError);
}

int BpTouchCompanionService::getAFEParams(SerializableMapArray& out) {
    Call call(kGetAFEParamsArray);
    return callForText(call, remote(), out, kGetAFEParamsArray.remoteError);
}

int BpTouchCompanionService::getPacketSize() {
    Call call(kGetPacketSize);
    int status = call.transact(remote());
    return status == STATUS_NO_ERROR ? call.reply.readInt32() : status;
}

int BpTouchCompanionService::inspect(unsigned int* value) {
    Call call(kInspect);
    int status = call.transactForStatus(remote());
    if (status == STATUS_NO_ERROR) {
        *value = static_cast<unsigned int>(call.reply.readInt32());
    }
    return status;
}

int BpTouchCompanionService::saveSession(int& sessionID) {
    Call call(kSaveSession);
    int status = call.transactForStatus(remote());
    if (status == STATUS_NO_ERROR) {
        sessionID = call.reply.readInt32();
        ALOGD("saveSession() sessionID: %d", sessionID);
    }
    return status;
}

int BpTouchCompanionService::restoreSession(int sessionID) {
    Call call(kRestoreSession);
    call.request.writeInt32(sessionID);
    return call.transactForStatus(remote());
}

int BpTouchCompanionService::setAuth(const std::string& auth) {
    Call call(kSetAuth);
    writeText(call.request, auth);
    return call.transactForStatus(remote());
}

IMPLEMENT_META_INTERFACE(TouchCompanionService, "pemaro.TouchService")

// ---- stub ----

namespace {

using Service = ITouchCompanionService;

// The operations that fill a fresh map or array: the status goes first, the text follows whatever
// it is.
template <typename Container, int (Service::*kOperation)(Container&)>
status_t replyFilled(Service& service, const Parcel&, Parcel& reply) {
    Container filled;
    reply.writeInt32((service.*kOperation)(filled));
    writeText(reply, filled.serialize());
    return NO_ERROR;
}

template <int (Service::*kOperation)(const std::string&)>
status_t replyText(Service& service, const Parcel& data, Parcel& reply) {
    return replyStatus(reply, (service.*kOperation)(readText(data)));
}

// An optional path is two codes, one for none and one for a path.
template <int (Service::*kOperation)(const std::string*)>
status_t replyNoPath(Service& service, const Parcel&, Parcel& reply) {
    return replyStatus(reply, (service.*kOperation)(nullptr));
}

template <int (Service::*kOperation)(const std::string*)>
status_t replyPath(Service& service, const Parcel& data, Parcel& reply) {
    std::string path = readText(data);
    return replyStatus(reply, (service.*kOperation)(&path));
}

// Unlike all others: the status is the transaction's result and the reply stays empty.
status_t onUnregisterClient(Service& service, const Parcel&, Parcel&) {
    return service.unregisterClient();
}

status_t onGetCblk(Service& service, const Parcel&, Parcel& reply) {
    sp<IMemory> memory = service.getCblk();
    if (memory == nullptr) {
        return STATUS_ERROR_ALLOCATING_MEMORY;
    }
    reply.writeStrongBinder(IInterface::asBinder(memory));
    return NO_ERROR;
}

status_t onSendEvent(Service& service, const Parcel& data, Parcel& reply) {
    int type = data.readInt32();
    int param = data.readInt32();
    return replyStatus(reply, service.sendEvent(type, param));
}

status_t onSetAFEParams(Service& service, const Parcel& data, Parcel& reply) {
    SerializableMap params;
    params.unserialize(readText(data));
    return replyStatus(reply, service.setAFEParams(params));
}

using Buffer = std::unique_ptr<void, decltype(&free)>;

// A length on the wire is an int32 whose sign is kept, so that a negative one is more than any
// memory.
Buffer allocateConfig(size_t size) {
    constexpr size_t kMost = std::numeric_limits<ptrdiff_t>::max();
    Buffer buffer(size <= kMost ? malloc(std::max<size_t>(size, 1)) : nullptr, &free);
    if (buffer == nullptr) {
        ALOGE("Error! could not allocate buffer for binary config data.");
    }
    return buffer;
}

status_t onSetConfigBinary(Service& service, const Parcel& data, Parcel& reply) {
    size_t size = static_cast<size_t>(data.readInt32());
    ALOGD("allocating %zu bytes for binary config data", size);
    Buffer buffer = allocateConfig(size);
    if (buffer == nullptr) {
        return STATUS_ERROR_ALLOCATING_MEMORY;
    }
    status_t status = data.read(buffer.get(), size);
    if (status != NO_ERROR) {
        ALOGE("error onTransact SET_CONFIG_BINARY: %s", transportText(status));
        return STATUS_UNKNOWN_ERROR;
    }
    return replyStatus(reply, service.setConfigParams(buffer.get(), size));
}

status_t onGetConfigBinary(Service& service, const Parcel& data, Parcel& reply) {
    size_t size = static_cast<size_t>(data.readInt32());
    Buffer buffer(nullptr, &free);
    if (size != 0) {
        buffer = allocateConfig(size);
        if (buffer == nullptr) {
            return STATUS_ERROR_ALLOCATING_MEMORY;
        }
    }
    size_t length = service.getConfigParams(buffer.get(), size);
    reply.writeInt32(static_cast<int32_t>(length));
    if (length == 0) {
        ALOGE("Error in getConfigParams (binary)!");
        return STATUS_UNKNOWN_ERROR;
    }
    if (size == 0) {
        return NO_ERROR;
    }
    if (length > size) {
        ALOGE("Error! binary data size is larger than provided buffer.");
        return STATUS_ERROR_ACQUIRING_RESOURCE;
    }
    reply.write(buffer.get(), length);
    return NO_ERROR;
}

status_t onInspect(Service& service, const Parcel&, Parcel& reply) {
    unsigned int value = 0;
    reply.writeInt32(service.inspect(&value));
    reply.writeInt32(static_cast<int32_t>(value));
    return NO_ERROR;
}

status_t onGetConfig(Service& service, const Parcel& data, Parcel& reply) {
    SerializableMap params;
    if (params.unserialize(readText(data)) != STATUS_NO_ERROR) {
        ALOGD("problem unserializing map after binder transact");
    }
    reply.writeInt32(service.getConfigParams(params));
    writeText(reply, params.serialize());
    return NO_ERROR;
}

status_t onSendCommand(Service& service, const Parcel& data, Parcel& reply) {
    SerializableMap request;
    SerializableMap response;
    request.unserialize(readText(data));
    reply.writeInt32(service.sendCommand(request, response));
    writeText(reply, response.serialize());
    return NO_ERROR;
}

status_t onSaveSession(Service& service, const Parcel&, Parcel& reply) {
    int sessionID = 0;
    reply.writeInt32(service.saveSession(sessionID));
    reply.writeInt32(sessionID);
    return NO_ERROR;
}

const StubRow<Service> kRows[] = {
        {replyObject<&Service::registerClient, ITouchCompanionClient>},
        {onUnregisterClient},
        {replyPlain<&Service::open>},
        {onGetCblk},
        {replyPlain<&Service::prepareRecord>},
        {replyPlain<&Service::startRecord>},
        {replyPlain<&Service::stopRecord>},
        {replyText<&Service::setRecordFile>},
        {onSendEvent},
        {replyPlain<&Service::close>},
        {replyNoPath<&Service::reloadConfig>},
        {replyPath<&Service::reloadConfig>},
        {replyInt<&Service::setRecordParameter>},
        {replyFilled<SerializableMap, &Service::getProperties>},
        {replyFilled<SerializableMap, &Service::getAFEParams>},
        {onSetAFEParams},
        {replyFilled<SerializableMapArray, &Service::getAFEParams>},
        {replyNoPath<&Service::saveConfig>},
        {replyPath<&Service::saveConfig>},
        {replyPlain<&Service::getPacketSize>},
        {onSetConfigBinary},
        {onGetConfigBinary},
        {onInspect},
        {onGetConfig},
        {onSendCommand},
        {onSaveSession},
        {replyInt<&Service::restoreSession>},
        {replyText<&Service::setAuth>},
};
static_assert(sizeof(kRows) / sizeof(kRows[0]) + 1 == END_OF_CODES, "one row a code");

}  // namespace

IMPLEMENT_STUB(TouchCompanionService, kRows)

}  // namespace pemaro
