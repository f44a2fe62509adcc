// SPDX-License-Identifier: Apache-2.0
// Opens the test kit's driver in a test program before its first test.

#include <gtest/gtest.h>

#include "pemaro/testkit/NativeBinder.h"

namespace pemaro::test {

namespace {

// Registered while the program's static objects are made.
class OpenDriver : public ::testing::Environment {
  public:
    void SetUp() override { openDriver(); }
};

[[maybe_unused]] const ::testing::Environment* const gOpenDriver =
        ::testing::AddGlobalTestEnvironment(new OpenDriver);

}  // namespace

}  // namespace pemaro::test
