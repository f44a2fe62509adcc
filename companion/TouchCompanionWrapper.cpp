// SPDX-License-Identifier: Apache-2.0
#define LOG_TAG "SerializableMap"

#include "companion/TouchCompanionWrapper.h"

#include <log/log.h>

#include "companion/SerializableParamsWrapper.h"
#include "pemaro/Status.h"

namespace pemaro {

// A client that fails to connect is kept all the same: it answers every later call with a status.
template <typename Facade>
int TouchCompanionWrapperBase<Facade>::init(TouchCompanionClient::DataCallback callback,
                                            void* context) {
    mClient = new TouchCompanionClient(callback, context);
    return mClient->init();
}

template <typename Facade>
int TouchCompanionWrapperBase<Facade>::setRecordOutput(int output) {
    return mClient->setRecordOutput(output);
}

template <typename Facade>
int TouchCompanionWrapperBase<Facade>::startRecord() {
    return mClient->startRecord();
}

template <typename Facade>
int TouchCompanionWrapperBase<Facade>::stopRecord() {
    return mClient->stopRecord();
}

template <typename Facade>
int TouchCompanionWrapperBase<Facade>::getConfigParams(ISerializableParams4* params) {
    if (params == nullptr) {
        ALOGE("error: params is null");
        return STATUS_BAD_PARAMETER;
    }
    return mClient->getConfigParams(paramsBehind(params));
}

template <typename Facade>
int TouchCompanionWrapperBase<Facade>::setConfigParams(ISerializableParams4* /* params */) {
    return STATUS_UNSUPPORTED;
}

template <typename Facade>
int TouchCompanionWrapperBase<Facade>::getConfigParams(void* buffer, unsigned long* len) {
    return mClient->getConfigParams(buffer, len);
}

template <typename Facade>
int TouchCompanionWrapperBase<Facade>::setConfigParams(const void* data, unsigned long size) {
    return mClient->setConfigParams(data, size);
}

template <typename Facade>
int TouchCompanionWrapperBase<Facade>::getPacketSize() {
    return mClient->getPacketSize();
}

template <typename Facade>
int TouchCompanionWrapperBase<Facade>::inspect(unsigned int* value) {
    return mClient->inspect(value);
}

template class TouchCompanionWrapperBase<ITouchCompanionFacade>;
template class TouchCompanionWrapperBase<ITouchCompanionFacadeOld>;

int TouchCompanionWrapper::getClassID() {
    return 2048;
}

int TouchCompanionWrapper::init(TouchCompanionClient::DataCallback callback, void* context) {
    int status = TouchCompanionWrapperBase::init(callback, context);
    if (status != STATUS_NO_ERROR) {
        ALOGE("Fails to initialize TouchCompanionClient");
    }
    return status;
}

int TouchCompanionWrapper::setRecordFilter(unsigned int mask) {
    return mClient->setRecordFilter(mask);
}

int TouchCompanionWrapper::sendCommand(const char* command, char** result) {
    if (command == nullptr) {
        return STATUS_BAD_PARAMETER;
    }
    return mClient->sendCommand(command, result);
}

int TouchCompanionWrapperOld::getClassID() {
    return 1792;
}

int TouchCompanionWrapperOld::getFormatDescription(std::string& /* first */,
                                                   std::string& /* second */) {
    return STATUS_UNSUPPORTED;
}

}  // namespace pemaro
