// SPDX-License-Identifier: Apache-2.0
#include "binder/ParcelText.h"

#include <utils/String8.h>

namespace pemaro {

void writeText(android::Parcel& parcel, const std::string& text) {
    parcel.writeString8(android::String8(text.data(), text.size()));
}

std::string readText(const android::Parcel& parcel) {
    android::String8 text = parcel.readString8();
    return std::string(text.c_str(), text.size());
}

}  // namespace pemaro
