// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <gtest/gtest.h>

#include <memory>
#include <string>

#include "pemaro/ISerializableParams3.h"
#include "pemaro/ISerializableParams4.h"
#include "pemaro/TouchCompanionFactory.h"

namespace pemaro::test {

/// The factory's object of a class, which is an `Interface`.
template <typename Interface>
std::unique_ptr<Interface> make(int classID) {
    void* instance = nullptr;
    EXPECT_EQ(0, VEXPemaroCreateInstance(classID, classID << 16, &instance));
    return std::unique_ptr<Interface>(static_cast<Interface*>(instance));
}

/// Parameter objects take their texts by reference.
inline int store(ISerializableParams4& params, std::string key, std::string value) {
    return params.setValue(key, value);
}

inline int store(ISerializableParams3& params, std::string key, std::string value) {
    return params.setParam(key, value);
}

}  // namespace pemaro::test
