// SPDX-License-Identifier: Apache-2.0
#include "pemaro/testkit/FakeTouchCompanionService.h"

#include <algorithm>
#include <cstring>
#include <utility>

namespace pemaro::test {

namespace {

std::string orNull(const std::string* path) {
    return path == nullptr ? "null" : *path;
}

}  // namespace

void FakeTouchCompanionService::setStatus(const std::string& operation, int status) {
    std::lock_guard<std::mutex> lock(mLock);
    mStatuses[operation] = status;
}

void FakeTouchCompanionService::onCall(std::function<void(const std::string& call)> hook) {
    std::lock_guard<std::mutex> lock(mLock);
    mHook = std::move(hook);
}

FakeTouchCompanionService::Calls FakeTouchCompanionService::calls() const {
    std::lock_guard<std::mutex> lock(mLock);
    return mCalls;
}

void FakeTouchCompanionService::clearCalls() {
    std::lock_guard<std::mutex> lock(mLock);
    mCalls.clear();
}

int FakeTouchCompanionService::called(const std::string& operation) {
    return note(operation, operation);
}

int FakeTouchCompanionService::called(const std::string& operation, const std::string& arguments) {
    return note(operation, operation + "(" + arguments + ")");
}

int FakeTouchCompanionService::note(const std::string& operation, const std::string& call) {
    std::function<void(const std::string&)> hook;
    int status;
    {
        std::lock_guard<std::mutex> lock(mLock);
        mCalls.push_back(call);
        auto found = mStatuses.find(operation);
        status = found == mStatuses.end() ? 0 : found->second;
        hook = mHook;
    }
    if (hook) {
        hook(call);
    }
    return status;
}

int FakeTouchCompanionService::registerClient(const android::sp<ITouchCompanionClient>& newClient) {
    android::sp<ITouchCompanionClient> previous = newClient;  // let go outside the lock
    {
        std::lock_guard<std::mutex> lock(mLock);
        std::swap(client, previous);
    }
    return called("registerClient");
}

int FakeTouchCompanionService::unregisterClient() {
    return called("unregisterClient");
}

int FakeTouchCompanionService::open() {
    return called("open");
}

android::sp<android::IMemory> FakeTouchCompanionService::getCblk() {
    called("getCblk");
    return cblk;
}

int FakeTouchCompanionService::prepareRecord() {
    return called("prepareRecord");
}

int FakeTouchCompanionService::startRecord() {
    return called("startRecord");
}

int FakeTouchCompanionService::stopRecord() {
    return called("stopRecord");
}

int FakeTouchCompanionService::setRecordParameter(int output) {
    return called("setRecordParameter", std::to_string(output));
}

int FakeTouchCompanionService::setRecordFile(const std::string& path) {
    return called("setRecordFile", path);
}

int FakeTouchCompanionService::sendEvent(int type, int param) {
    return called("sendEvent", std::to_string(type) + "," + std::to_string(param));
}

int FakeTouchCompanionService::close() {
    return called("close");
}

int FakeTouchCompanionService::reloadConfig(const std::string* path) {
    return called("reloadConfig", orNull(path));
}

int FakeTouchCompanionService::saveConfig(const std::string* path) {
    return called("saveConfig", orNull(path));
}

size_t FakeTouchCompanionService::getConfigParams(void* buffer, size_t size) {
    called("getConfigParams", "binary");
    if (buffer != nullptr && !config.empty()) {
        memcpy(buffer, config.data(), std::min(size, config.size()));
    }
    return configLength >= 0 ? static_cast<size_t>(configLength) : config.size();
}

int FakeTouchCompanionService::getConfigParams(SerializableMap& map) {
    int status = called("getConfigParams", map.serialize());
    map += params;
    return status;
}

int FakeTouchCompanionService::setConfigParams(const void* data, size_t size) {
    const uint8_t* bytes = static_cast<const uint8_t*>(data);
    receivedConfig.assign(bytes, bytes + size);
    return called("setConfigParams", "binary");
}

int FakeTouchCompanionService::getProperties(SerializableMap& out) {
    out = properties;
    return called("getProperties");
}

int FakeTouchCompanionService::sendCommand(SerializableMap& request, SerializableMap& answer) {
    answer = response;
    return called("sendCommand", request.serialize());
}

int FakeTouchCompanionService::setAFEParams(SerializableMap& map) {
    return called("setAFEParams", map.serialize());
}

int FakeTouchCompanionService::getAFEParams(SerializableMap& out) {
    out = afeParams;
    return called("getAFEParams", "map");
}

int FakeTouchCompanionService::getAFEParams(SerializableMapArray& out) {
    out = afeArray;
    return called("getAFEParams", "array");
}

int FakeTouchCompanionService::getPacketSize() {
    called("getPacketSize");
    return packetSize;
}

int FakeTouchCompanionService::inspect(unsigned int* value) {
    *value = inspection;
    return called("inspect");
}

int FakeTouchCompanionService::saveSession(int& id) {
    id = sessionID;
    return called("saveSession");
}

int FakeTouchCompanionService::restoreSession(int id) {
    return called("restoreSession", std::to_string(id));
}

int FakeTouchCompanionService::setAuth(const std::string& auth) {
    return called("setAuth", auth);
}

}  // namespace pemaro::test
