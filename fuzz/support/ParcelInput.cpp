// SPDX-License-Identifier: Apache-2.0
#include "fuzz/support/ParcelInput.h"

#include <utils/String16.h>
#include <utils/String8.h>

#include <cstdio>
#include <cstdlib>
#include <cstring>

#include "pemaro/IGestureManagerClient.h"
#include "pemaro/IHandBiometricManagerClient.h"
#include "tests/support/ParcelBytes.h"
#include "tests/values/reference/ReferenceReader.h"

namespace pemaro::fuzz {

namespace {

constexpr size_t kLongestText = 512;
constexpr size_t kRecordSizes[] = {sizeof(IHandBiometricManagerClient::HandBioData),
                                   sizeof(IGestureManagerClient::GestureData)};

// Seldom, for they are large and there is little in them to be misread.
void writeRecord(android::Parcel& parcel, FuzzedDataProvider& input) {
    if (input.ConsumeIntegralInRange(0, 7) != 0) {
        return;
    }
    // One record, one byte less, or one byte more.
    const size_t size = input.PickValueInArray(kRecordSizes) +
                        static_cast<size_t>(input.ConsumeIntegralInRange<int>(-1, 1));
    auto* record = static_cast<uint8_t*>(parcel.writeInplace(size));
    if (record != nullptr) {
        record[0] = record[size - 1] = input.ConsumeIntegral<uint8_t>();
    }
}

enum class Field {
    kNumber,
    kSmallNumber,
    kString8,
    kCString,
    kString16,
    kBytes,
    kObject,
    kRecord,
    kMaxValue = kRecord
};

void writeField(android::Parcel& parcel, FuzzedDataProvider& input, const Binders& binders) {
    switch (input.ConsumeEnum<Field>()) {
        case Field::kNumber:
            parcel.writeInt32(input.ConsumeIntegral<int32_t>());
            break;
        case Field::kSmallNumber:
            parcel.writeInt32(input.ConsumeIntegralInRange<int32_t>(-2, 20));
            break;
        case Field::kString8: {
            const std::string text = input.ConsumeRandomLengthString(kLongestText);
            parcel.writeString8(android::String8(text.data(), text.size()));
            break;
        }
        case Field::kCString:
            parcel.writeCString(input.ConsumeRandomLengthString(kLongestText).c_str());
            break;
        case Field::kString16:
            parcel.writeString16(
                    android::String16(input.ConsumeRandomLengthString(kLongestText).c_str()));
            break;
        case Field::kBytes: {
            const std::string bytes = input.ConsumeRandomLengthString(kLongestText);
            parcel.write(bytes.data(), bytes.size());
            break;
        }
        case Field::kObject:
            parcel.writeStrongBinder(
                    binders[input.ConsumeIntegralInRange<size_t>(0, binders.size() - 1)]);
            break;
        case Field::kRecord:
            writeRecord(parcel, input);
            break;
    }
}

}  // namespace

void fillParcel(android::Parcel& parcel, FuzzedDataProvider& input, const Binders& binders) {
    while (input.remaining_bytes() > 0 && input.ConsumeBool()) {
        writeField(parcel, input, binders);
    }
}

bool isFatalText(const std::string& text) {
    const size_t open = text.find_first_of("{[");
    return open != std::string::npos &&
           (reference::readMap(text).aborts || reference::readArray(text).aborts);
}

// A text may stand at each multiple of four bytes: its length, and then its bytes.
bool holdsFatalText(const android::Parcel& parcel) {
    const test::Bytes bytes = test::bytesOf(parcel);
    int32_t length = 0;
    for (size_t start = 0; start + sizeof(length) < bytes.size(); start += sizeof(length)) {
        memcpy(&length, &bytes[start], sizeof(length));
        const size_t left = bytes.size() - start - sizeof(length);
        // Whole records hold no text.
        if (length < 2 || static_cast<size_t>(length) >= left ||
            length > int32_t{2 * kLongestText}) {
            continue;
        }
        const auto* text = reinterpret_cast<const char*>(&bytes[start + sizeof(length)]);
        if (isFatalText(std::string(text, static_cast<size_t>(length)).c_str())) {
            return true;
        }
    }
    return false;
}

void touch(const void* data, size_t size) {
    const auto* bytes = static_cast<const uint8_t*>(data);
    uint8_t sum = 0;
    for (size_t i = 0; i < size; ++i) {
        sum = static_cast<uint8_t>(sum + bytes[i]);
    }
    // The compiler must not know that nobody looks at it.
    __asm__ volatile("" : : "r"(sum));
}

void fail(const char* what) {
    fprintf(stderr, "%s\n", what);
    abort();
}

void expect(bool holds, const char* what) {
    if (!holds) {
        fail(what);
    }
}

}  // namespace pemaro::fuzz

// Inputs are small, and what they use is used again: with the usual 256 MiB of freed memory kept aside most of
// the time would go into fresh pages, and with gigabytes that a request may ask for, into their shadow. An
// allocation that is too large fails, as on a device.
extern "C" const char* __asan_default_options() {
    return "quarantine_size_mb=8:malloc_context_size=12:"
           "max_allocation_size_mb=32:allocator_may_return_null=1";
}
