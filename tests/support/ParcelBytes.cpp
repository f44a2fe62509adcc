// SPDX-License-Identifier: Apache-2.0
#include "tests/support/ParcelBytes.h"

#include <utils/String16.h>
#include <utils/String8.h>

namespace pemaro::test {

Bytes bytesOf(const android::Parcel& parcel) {
    const uint8_t* data = parcel.data();
    return data == nullptr ? Bytes() : Bytes(data, data + parcel.dataSize());
}

Bytes parcelBytes(const ParcelWriter& write) {
    android::Parcel parcel;
    write(parcel);
    return bytesOf(parcel);
}

Bytes requestBytes(const std::string& descriptor, const ParcelWriter& write) {
    return parcelBytes([&](android::Parcel& parcel) {
        writeToken(parcel, descriptor);
        if (write) {
            write(parcel);
        }
    });
}

void writeToken(android::Parcel& parcel, const std::string& descriptor) {
    parcel.writeInterfaceToken(android::String16(descriptor.c_str()));
}

void writeString8(android::Parcel& parcel, const std::string& text) {
    parcel.writeString8(android::String8(text.data(), text.size()));
}

}  // namespace pemaro::test
