// SPDX-License-Identifier: Apache-2.0
#include "pemaro/SerializableBlob.h"

#include <cstring>
#include <utility>

namespace pemaro {

SerializableBlob::SerializableBlob() : mData(nullptr), mSize(0) {}

SerializableBlob::SerializableBlob(const void* data, unsigned long size)
        : mData(nullptr), mSize(size) {
    if (size == 0) return;
    mData = new unsigned char[size];
    memcpy(mData, data, size);
}

SerializableBlob::SerializableBlob(const SerializableBlob& other)
        : SerializableBlob(other.mData, other.mSize) {}

SerializableBlob::~SerializableBlob() {
    delete[] mData;
}

SerializableBlob& SerializableBlob::operator=(SerializableBlob other) {
    swap(other);
    return *this;
}

void SerializableBlob::swap(SerializableBlob& other) {
    std::swap(mData, other.mData);
    std::swap(mSize, other.mSize);
}

unsigned long SerializableBlob::getSize() {
    return mSize;
}

unsigned long SerializableBlob::getValue(void* dest, unsigned long capacity) {
    if (mSize == 0 || mSize > capacity) return 0;
    memcpy(dest, mData, mSize);
    return mSize;
}

std::string SerializableBlob::serialize() {
    return "blob";
}

}  // namespace pemaro
