// SPDX-License-Identifier: Apache-2.0
#define LOG_TAG "SerializableMap"

#include "pemaro/SerializableMapArray.h"

#include "pemaro/Status.h"
#include "values/TextWriter.h"
#include "values/TreeReader.h"
#include "values/ValueTree.h"

namespace pemaro {

SerializableMapArray::SerializableMapArray() = default;

SerializableMapArray::SerializableMapArray(const SerializableMapArray& other) {
    copyTree(other, *this);
}

SerializableMapArray::~SerializableMapArray() {
    destroyNested(*this);
}

SerializableMapArray& SerializableMapArray::operator=(const SerializableMapArray& other) {
    SerializableMapArray copy(other);
    moveTree(copy, *this);
    return *this;
}

const SerializableValue& SerializableMapArray::get(unsigned long index) const {
    return mElements[index];
}

SerializableValue& SerializableMapArray::get(unsigned long index) {
    return mElements.editItemAt(index);
}

int SerializableMapArray::set(unsigned long index, const SerializableValue& value) {
    if (index >= mElements.size()) return STATUS_INDEX_OUT_OF_BOUNDS;
    mElements.editItemAt(index) = value;
    return STATUS_NO_ERROR;
}

int SerializableMapArray::add(const SerializableValue& value) {
    // Copied before the vector grows, for `value` may be one of the elements, which move then.
    SerializableValue copy(value);
    mElements.add(defaultValue());
    mElements.editTop().swap(copy);
    return STATUS_NO_ERROR;
}

void SerializableMapArray::clear() {
    mElements = android::Vector<SerializableValue>();
}

std::string SerializableMapArray::serialize() {
    return writeText(*this);
}

int SerializableMapArray::unserialize(const std::string& text) {
    SerializableMapArray result;
    if (!TreeReader(text.c_str()).read(result)) return STATUS_INVALID_FORMAT;
    moveTree(result, *this);
    return STATUS_NO_ERROR;
}

}  // namespace pemaro
