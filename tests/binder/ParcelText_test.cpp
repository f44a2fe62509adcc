// SPDX-License-Identifier: Apache-2.0
#include "binder/ParcelText.h"

#include <gtest/gtest.h>

#include "tests/support/ParcelBytes.h"

namespace pemaro::test {
namespace {

using android::Parcel;

// The length without the NUL, the bytes, the NUL, and zeros up to four bytes.
TEST(ParcelText, CrossesWithAllItsBytes) {
    const std::string text("a\0b", 3);
    Parcel parcel;
    writeText(parcel, text);
    EXPECT_EQ((Bytes{3, 0, 0, 0, 'a', 0, 'b', 0}), bytesOf(parcel));
    parcel.setDataPosition(0);
    EXPECT_EQ(text, readText(parcel));
    EXPECT_EQ(0u, parcel.dataAvail());
}

// A length of 0 stands alone: the platform of the desk writes no NUL behind it.
TEST(ParcelText, CrossesEmpty) {
    Parcel parcel;
    writeText(parcel, "");
    EXPECT_EQ((Bytes{0, 0, 0, 0}), bytesOf(parcel));
    parcel.setDataPosition(0);
    EXPECT_EQ("", readText(parcel));
}

TEST(ParcelText, ReadsAsEmptyWhereThereIsNone) {
    Parcel parcel;
    EXPECT_EQ("", readText(parcel));
    parcel.writeInt32(100);  // more than there is
    parcel.setDataPosition(0);
    EXPECT_EQ("", readText(parcel));
}

}  // namespace
}  // namespace pemaro::test
