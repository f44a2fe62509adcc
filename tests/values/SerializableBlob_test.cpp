// SPDX-License-Identifier: Apache-2.0
#include "pemaro/SerializableBlob.h"

#include <gtest/gtest.h>

#include <cstring>

namespace pemaro {
namespace {

std::string bytesOf(SerializableBlob& blob) {
    std::string bytes(blob.getSize(), '\0');
    EXPECT_EQ(blob.getValue(bytes.data(), bytes.size()), bytes.size());
    return bytes;
}

TEST(SerializableBlob, IsEmptyWhenMadeOfNothing) {
    SerializableBlob blob;
    EXPECT_EQ(blob.getSize(), 0u);
    char untouched = 'u';
    EXPECT_EQ(blob.getValue(&untouched, 1), 0u);
    EXPECT_EQ(untouched, 'u');
    SerializableBlob zero("abc", 0);
    EXPECT_EQ(zero.getSize(), 0u);
}

TEST(SerializableBlob, CopiesTheBytesItIsMadeOf) {
    char bytes[] = {'a', '\0', 'c'};
    SerializableBlob blob(bytes, sizeof(bytes));
    bytes[0] = 'z';
    EXPECT_EQ(bytesOf(blob), std::string("a\0c", 3));
}

TEST(SerializableBlob, GivesNothingToATooSmallDestination) {
    SerializableBlob blob("abcd", 4);
    char destination[4] = {'1', '2', '3', '4'};
    EXPECT_EQ(blob.getValue(destination, 3), 0u);
    EXPECT_EQ(memcmp(destination, "1234", 4), 0);
    EXPECT_EQ(blob.getValue(destination, 4), 4u);
    EXPECT_EQ(memcmp(destination, "abcd", 4), 0);
}

TEST(SerializableBlob, CopiesHaveBytesOfTheirOwn) {
    SerializableBlob assigned("x", 1);
    SerializableBlob copy;
    {
        SerializableBlob original("abcd", 4);
        SerializableBlob constructed(original);
        copy.swap(constructed);
        EXPECT_EQ(constructed.getSize(), 0u);
        assigned = original;
        assigned = *&assigned;
    }
    EXPECT_EQ(bytesOf(copy), "abcd");
    EXPECT_EQ(bytesOf(assigned), "abcd");
}

TEST(SerializableBlob, IsWrittenAsAWord) {
    EXPECT_EQ(SerializableBlob("abcd", 4).serialize(), "blob");
    EXPECT_EQ(SerializableBlob().serialize(), "blob");
}

}  // namespace
}  // namespace pemaro
