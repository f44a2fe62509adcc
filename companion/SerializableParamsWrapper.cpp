// SPDX-License-Identifier: Apache-2.0
#define LOG_TAG "SerializableMap"

#include "companion/SerializableParamsWrapper.h"

#include <log/log.h>

#include "pemaro/Status.h"

namespace pemaro {

namespace {

using Entries = android::KeyedVector<std::string, SerializableValue>;

int keyAt(SerializableMap& params, int index, std::string& key) {
    return params.keyAt(static_cast<unsigned long>(index), key);
}

// The vector's own access, which is fatal for a position that does not exist.
int textAt(const SerializableMap& params, int index, std::string& value) {
    return params.Entries::valueAt(static_cast<size_t>(index)).getValue(value);
}

int storeText(SerializableMap& params, const std::string& key, const std::string& value) {
    return params.replaceValueFor(key, SerializableValue(value)) >= 0 ? STATUS_NO_ERROR
                                                                      : STATUS_UNKNOWN_ERROR;
}

}  // namespace

int SerializableParamsWrapper::getClassID() {
    return 4;
}

int SerializableParamsWrapper::size() {
    return static_cast<int>(mParams.size());
}

int SerializableParamsWrapper::getKeyAt(int index, std::string& key) {
    return keyAt(mParams, index, key);
}

int SerializableParamsWrapper::getValueAt(int index, std::string& value) {
    return textAt(mParams, index, value);
}

int SerializableParamsWrapper::getValue(const std::string& key, std::string& value) {
    int status = mParams.editValueFor(key).getValue(value);
    if (status != STATUS_NO_ERROR) {
        ALOGE("error getting param: %s", errStr(status));
    }
    return status;
}

int SerializableParamsWrapper::setValue(std::string& key, std::string& value) {
    return storeText(mParams, key, value);
}

int SerializableParamsWrapperOld::getClassID() {
    return 3;
}

int SerializableParamsWrapperOld::size() {
    return static_cast<int>(mParams.size());
}

int SerializableParamsWrapperOld::getKey(int index, std::string& key) {
    return keyAt(mParams, index, key);
}

int SerializableParamsWrapperOld::getValue(int index, std::string& value) {
    return textAt(mParams, index, value);
}

int SerializableParamsWrapperOld::setParam(std::string& key, std::string& value) {
    return storeText(mParams, key, value);
}

}  // namespace pemaro
