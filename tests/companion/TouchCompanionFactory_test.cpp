// SPDX-License-Identifier: Apache-2.0
// The exported factory under both of its names.

#include "pemaro/TouchCompanionFactory.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <string>

#include "pemaro/ISerializableParams3.h"
#include "pemaro/ISerializableParams4.h"
#include "pemaro/ITouchCompanionFacade.h"
#include "pemaro/ITouchCompanionFacadeOld.h"
#include "pemaro/testkit/FakeServiceManager.h"
#include "pemaro/testkit/LogRecorder.h"

namespace pemaro::test {
namespace {

using ::testing::IsEmpty;

using Factory = int (*)(int classID, int version, void** instance);

struct NamedFactory {
    const char* name;
    Factory create;
};

void PrintTo(const NamedFactory& factory, std::ostream* out) {
    *out << factory.name;
}

class TouchCompanionFactory : public ::testing::TestWithParam<NamedFactory> {
  protected:
    template <typename Interface>
    static int classOf(void* instance) {
        Interface* const object = static_cast<Interface*>(instance);
        const int classID = object->getClassID();
        delete object;
        return classID;
    }
};

INSTANTIATE_TEST_SUITE_P(, TouchCompanionFactory,
                         ::testing::Values(NamedFactory{"VEX", VEXPemaroCreateInstance},
                                           NamedFactory{"DURA", DURAPemaroCreateInstance}),
                         [](const auto& info) { return std::string(info.param.name); });

TEST_P(TouchCompanionFactory, MakesTheFourClasses) {
    const struct {
        int classID;
        int version;
        int (*classOf)(void*);
    } rows[] = {
            {2048, 0x8000000, classOf<ITouchCompanionFacade>},
            {1792, 0x7000000, classOf<ITouchCompanionFacadeOld>},
            {4, 0x40000, classOf<ISerializableParams4>},
            {3, 0x30000, classOf<ISerializableParams3>},
    };
    for (const auto& row : rows) {
        SCOPED_TRACE(row.classID);
        EXPECT_EQ(row.classID << 16, row.version);
        void* instance = nullptr;
        ASSERT_EQ(0, GetParam().create(row.classID, row.version, &instance));
        ASSERT_NE(nullptr, instance);
        EXPECT_EQ(row.classID, row.classOf(instance));
    }
}

TEST_P(TouchCompanionFactory, RefusesEveryOtherPair) {
    const struct {
        int classID;
        int version;
    } rows[] = {
            {2048, 0x7000000}, {1792, 0x8000000},  {4, 0x30000},
            {3, 0x40000},      {5, 0x50000},       {0, 0},
            {2048, 2048},      {2048, 0},          {4, 0},
            {4, 0x40001},      {-2048, 0x8000000}, {1793, 0x7010000},
            {2, 0x20000},      {0x40000, 4},
    };
    LogRecorder::instance().clear();
    for (const auto& row : rows) {
        int marker = 0;
        void* instance = &marker;
        EXPECT_EQ(0x4000000D, GetParam().create(row.classID, row.version, &instance))
                << row.classID << " " << row.version;
        EXPECT_EQ(&marker, instance);
    }
    EXPECT_THAT(LogRecorder::instance().lines(), IsEmpty());
}

TEST_P(TouchCompanionFactory, MakesANewObjectEachTime) {
    void* first = nullptr;
    void* second = nullptr;
    ASSERT_EQ(0, GetParam().create(4, 0x40000, &first));
    ASSERT_EQ(0, GetParam().create(4, 0x40000, &second));
    EXPECT_NE(first, second);
    EXPECT_EQ(4, classOf<ISerializableParams4>(first));
    EXPECT_EQ(4, classOf<ISerializableParams4>(second));
}

TEST_P(TouchCompanionFactory, ConnectsNothing) {
    ScopedServiceManager services;
    for (const int classID : {2048, 1792}) {
        void* instance = nullptr;
        ASSERT_EQ(0, GetParam().create(classID, classID << 16, &instance));
        classID == 2048 ? classOf<ITouchCompanionFacade>(instance)
                        : classOf<ITouchCompanionFacadeOld>(instance);
    }
    EXPECT_EQ(0, services->lookups("pemaro.TouchService"));
}

}  // namespace
}  // namespace pemaro::test
