// SPDX-License-Identifier: Apache-2.0
#define LOG_TAG "SerializableMap"

#include "pemaro/SerializableValue.h"

#include <log/log.h>

#include <algorithm>
#include <utility>

#include "pemaro/SerializableBlob.h"
#include "pemaro/SerializableMap.h"
#include "pemaro/SerializableMapArray.h"
#include "pemaro/Status.h"
#include "values/NumberText.h"
#include "values/TextWriter.h"
#include "values/ValueAccess.h"
#include "values/ValueTree.h"

namespace pemaro {

namespace {

constexpr size_t kInitialZeros = 50;

/// A copy of what `held` points at, or of an empty container when there is none.
template <typename Container>
Container copyOf(const Container* held) {
    if (held == nullptr) return Container();
    return *held;
}

template <typename Container>
Container* cloneOf(const Container* held) {
    return held == nullptr ? nullptr : new Container(*held);
}

/// The container to refer to, made when there is none.
template <typename Container>
Container& ensure(Container*& held) {
    if (held == nullptr) held = new Container;
    return *held;
}

/// Whether `text` begins with `word`, given in lower case, in either case of letters.
bool beginsWith(const std::string& text, const char* word) {
    for (size_t i = 0; word[i] != '\0'; ++i) {
        if (i == text.size()) return false;
        const char c = text[i];
        if ((c >= 'A' && c <= 'Z' ? c - 'A' + 'a' : c) != word[i]) return false;
    }
    return true;
}

}  // namespace

SerializableValue::SerializableValue()
        : mType(VALUE_TYPE_NULL),
          mMap(nullptr),
          mArray(nullptr),
          mBlob(nullptr),
          mValue(kInitialZeros, '0') {}

SerializableValue::SerializableValue(const std::string& value, int type)
        : mType(static_cast<uint32_t>(type)),
          mMap(nullptr),
          mArray(nullptr),
          mBlob(nullptr),
          mValue(value) {}

SerializableValue::SerializableValue(const unsigned char& value)
        : SerializableValue(formatUnsigned(value), VALUE_TYPE_UINT8) {}

SerializableValue::SerializableValue(const signed char& value)
        : SerializableValue(formatSigned(value), VALUE_TYPE_INT8) {}

SerializableValue::SerializableValue(const unsigned short& value)
        : SerializableValue(formatUnsigned(value), VALUE_TYPE_UINT16) {}

SerializableValue::SerializableValue(const short& value)
        : SerializableValue(formatSigned(value), VALUE_TYPE_INT16) {}

SerializableValue::SerializableValue(const unsigned int& value)
        : SerializableValue(formatUnsigned(value), VALUE_TYPE_UINT32) {}

SerializableValue::SerializableValue(const int& value)
        : SerializableValue(formatSigned(value), VALUE_TYPE_INT32) {}

SerializableValue::SerializableValue(const float& value)
        : SerializableValue(formatFloat(value), VALUE_TYPE_FLOAT) {}

SerializableValue::SerializableValue(const bool& value)
        : SerializableValue(value ? "true" : "false", VALUE_TYPE_BOOL) {}

SerializableValue::SerializableValue(const std::string& value)
        : SerializableValue(value, VALUE_TYPE_STRING) {}

SerializableValue::SerializableValue(const SerializableMap& value) : SerializableValue() {
    mMap = new SerializableMap(value);
    mType = VALUE_TYPE_OBJECT;
}

SerializableValue::SerializableValue(const SerializableMapArray& value) : SerializableValue() {
    mArray = new SerializableMapArray(value);
    mType = VALUE_TYPE_ARRAY;
}

SerializableValue::SerializableValue(const SerializableBlob& value) : SerializableValue() {
    mBlob = new SerializableBlob(value);
    mType = VALUE_TYPE_BLOB;
}

SerializableValue::SerializableValue(const SerializableValue& other)
        : mType(other.mType), mMap(nullptr), mArray(nullptr), mBlob(nullptr) {
    switch (mType) {
        case VALUE_TYPE_NULL:
            break;
        case VALUE_TYPE_OBJECT:
            mMap = cloneOf(other.mMap);
            break;
        case VALUE_TYPE_ARRAY:
            mArray = cloneOf(other.mArray);
            break;
        case VALUE_TYPE_BLOB:
            mBlob = cloneOf(other.mBlob);
            break;
        default:
            mValue = other.mValue;
    }
}

SerializableValue::~SerializableValue() {
    switch (mType) {
        case VALUE_TYPE_OBJECT:
            delete mMap;
            break;
        case VALUE_TYPE_ARRAY:
            delete mArray;
            break;
        case VALUE_TYPE_BLOB:
            delete mBlob;
            break;
        default:
            break;
    }
}

SerializableValue& SerializableValue::operator=(SerializableValue other) {
    swap(other);
    return *this;
}

void SerializableValue::swap(SerializableValue& other) {
    std::swap(mType, other.mType);
    std::swap(mMap, other.mMap);
    std::swap(mArray, other.mArray);
    std::swap(mBlob, other.mBlob);
    mValue.swap(other.mValue);
}

int SerializableValue::getValue(unsigned int& value) const {
    if (ValueAccess::hasContainerTag(*this)) return STATUS_INVALID_FORMAT;
    return scanUnsigned(mValue.c_str(), value) ? STATUS_NO_ERROR : STATUS_INVALID_FORMAT;
}

int SerializableValue::getValue(int& value) const {
    if (ValueAccess::hasContainerTag(*this)) return STATUS_INVALID_FORMAT;
    return scanSigned(mValue.c_str(), value) ? STATUS_NO_ERROR : STATUS_INVALID_FORMAT;
}

int SerializableValue::getValue(float& value) const {
    if (ValueAccess::hasContainerTag(*this)) return STATUS_INVALID_FORMAT;
    return scanFloat(mValue.c_str(), value) ? STATUS_NO_ERROR : STATUS_INVALID_FORMAT;
}

namespace {

/// Reads a wide number and stores its low bits.
template <typename Wide, typename Narrow>
int getLowBits(const SerializableValue& from, Narrow& value) {
    Wide wide = 0;
    const int status = from.getValue(wide);
    if (status == STATUS_NO_ERROR) value = static_cast<Narrow>(wide);
    return status;
}

}  // namespace

int SerializableValue::getValue(unsigned short& value) const {
    return getLowBits<unsigned int>(*this, value);
}

int SerializableValue::getValue(short& value) const {
    return getLowBits<int>(*this, value);
}

int SerializableValue::getValue(unsigned char& value) const {
    return getLowBits<unsigned int>(*this, value);
}

int SerializableValue::getValue(signed char& value) const {
    return getLowBits<int>(*this, value);
}

int SerializableValue::getValue(bool& value) const {
    if (ValueAccess::hasContainerTag(*this)) return STATUS_INVALID_FORMAT;
    const bool isFalse = beginsWith(mValue, "false");
    if (!isFalse && !beginsWith(mValue, "true")) return STATUS_INVALID_FORMAT;
    value = !isFalse;
    return STATUS_NO_ERROR;
}

int SerializableValue::getValue(std::string& value) const {
    if (ValueAccess::hasContainerTag(*this)) return STATUS_INVALID_FORMAT;
    value = mValue;
    return STATUS_NO_ERROR;
}

// Replacing the target's contents may destroy this value, which can be one of them: it comes last.

int SerializableValue::getValue(SerializableMap& value) const {
    if (mType != VALUE_TYPE_OBJECT) return STATUS_INVALID_FORMAT;
    SerializableMap copy(copyOf(mMap));
    moveTree(copy, value);
    return STATUS_NO_ERROR;
}

int SerializableValue::getValue(SerializableMapArray& value) const {
    if (mType != VALUE_TYPE_ARRAY) return STATUS_INVALID_FORMAT;
    SerializableMapArray copy(copyOf(mArray));
    moveTree(copy, value);
    return STATUS_NO_ERROR;
}

int SerializableValue::getValue(SerializableBlob& value) const {
    if (mType != VALUE_TYPE_BLOB) return STATUS_INVALID_FORMAT;
    value = copyOf(mBlob);
    return STATUS_NO_ERROR;
}

namespace {
constexpr const char* kTypeMismatch = "getValue() return type must match object type";
}  // namespace

// The conditions are part of what is logged.

template <>
std::string& SerializableValue::getValue<std::string>() {
    LOG_ALWAYS_FATAL_IF(!(mType != VALUE_TYPE_NULL && mType != VALUE_TYPE_OBJECT &&
                          mType != VALUE_TYPE_ARRAY && mType != VALUE_TYPE_BLOB),
                        "%s", kTypeMismatch);
    return mValue;
}

template <>
SerializableMap& SerializableValue::getValue<SerializableMap>() {
    LOG_ALWAYS_FATAL_IF(!(mType == VALUE_TYPE_OBJECT), "%s", kTypeMismatch);
    return ensure(mMap);
}

template <>
SerializableMapArray& SerializableValue::getValue<SerializableMapArray>() {
    LOG_ALWAYS_FATAL_IF(!(mType == VALUE_TYPE_ARRAY), "%s", kTypeMismatch);
    return ensure(mArray);
}

std::string SerializableValue::serialize() {
    switch (mType) {
        case VALUE_TYPE_OBJECT:
            return mMap == nullptr ? writeText(SerializableMap()) : writeText(*mMap);
        case VALUE_TYPE_ARRAY:
            return mArray == nullptr ? writeText(SerializableMapArray()) : writeText(*mArray);
        case VALUE_TYPE_BLOB:
            return SerializableBlob().serialize();
        default:
            return mValue;
    }
}

}  // namespace pemaro
