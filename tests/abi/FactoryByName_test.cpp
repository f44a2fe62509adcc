// SPDX-License-Identifier: Apache-2.0
// The shared library as a program finds it by name: this one links nothing of it, and reaches objects
// through their interfaces alone. (examples/facade_by_name.cpp does the same with a service.)

#include <dlfcn.h>
#include <gtest/gtest.h>

#include <memory>
#include <string>

#include "pemaro/ISerializableParams3.h"
#include "pemaro/ISerializableParams4.h"
#include "pemaro/ITouchCompanionFacade.h"
#include "pemaro/ITouchCompanionFacadeOld.h"

namespace pemaro::test {
namespace {

using Factory = int (*)(int classID, int version, void** instance);

class FactoryByName : public ::testing::TestWithParam<const char*> {
  protected:
    void SetUp() override {
        void* const library = dlopen(ZELK_LIBRARY, RTLD_NOW | RTLD_LOCAL);
        ASSERT_NE(nullptr, library) << dlerror();
        mCreate = reinterpret_cast<Factory>(dlsym(library, GetParam()));
        ASSERT_NE(nullptr, mCreate) << dlerror();
    }

    template <typename Interface>
    std::unique_ptr<Interface> make(int classID) {
        void* instance = nullptr;
        EXPECT_EQ(0, mCreate(classID, classID << 16, &instance));
        return std::unique_ptr<Interface>(static_cast<Interface*>(instance));
    }

    Factory mCreate = nullptr;
};

INSTANTIATE_TEST_SUITE_P(, FactoryByName,
                         ::testing::Values("VEXPemaroCreateInstance", "DURAPemaroCreateInstance"),
                         [](const auto& info) { return std::string(info.param); });

TEST_P(FactoryByName, MakesFacades) {
    const auto facade = make<ITouchCompanionFacade>(2048);
    EXPECT_EQ(2048, facade->getClassID());
    EXPECT_EQ(0x4000000E, facade->setConfigParams(nullptr));
    EXPECT_EQ(0x4000000D, facade->sendCommand(nullptr, nullptr));
    const auto older = make<ITouchCompanionFacadeOld>(1792);
    EXPECT_EQ(1792, older->getClassID());
    EXPECT_EQ(0x4000000E, older->setConfigParams(nullptr));
}

TEST_P(FactoryByName, MakesParameterObjects) {
    const auto params = make<ISerializableParams4>(4);
    EXPECT_EQ(4, params->getClassID());
    std::string key = "gain";
    std::string value = "3";
    EXPECT_EQ(0, params->setValue(key, value));
    value.clear();
    EXPECT_EQ(0, params->getValue("gain", value));
    EXPECT_EQ("3", value);

    const auto older = make<ISerializableParams3>(3);
    EXPECT_EQ(3, older->getClassID());
    EXPECT_EQ(0, older->setParam(key, value));
    EXPECT_EQ(1, older->size());
}

TEST_P(FactoryByName, RefusesOtherPairs) {
    int marker = 0;
    void* instance = &marker;
    EXPECT_EQ(0x4000000D, mCreate(2048, 0x7000000, &instance));
    EXPECT_EQ(&marker, instance);
}

}  // namespace
}  // namespace pemaro::test
