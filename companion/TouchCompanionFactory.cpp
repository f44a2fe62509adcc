// SPDX-License-Identifier: Apache-2.0
#include "pemaro/TouchCompanionFactory.h"

#include "companion/SerializableParamsWrapper.h"
#include "companion/TouchCompanionWrapper.h"
#include "pemaro/Status.h"

namespace pemaro {

namespace {

// The caller uses the pointer as the interface that belongs to the class identifier.
template <typename Interface, typename Object>
void* make() {
    return static_cast<Interface*>(new Object());
}

struct FactoryRow {
    int classID;
    int version;
    void* (*make)();
};

constexpr FactoryRow kFactory[] = {
        {2048, 0x8000000, make<ITouchCompanionFacade, TouchCompanionWrapper>},
        {1792, 0x7000000, make<ITouchCompanionFacadeOld, TouchCompanionWrapperOld>},
        {4, 0x40000, make<ISerializableParams4, SerializableParamsWrapper>},
        {3, 0x30000, make<ISerializableParams3, SerializableParamsWrapperOld>},
};

}  // namespace

}  // namespace pemaro

int DURAPemaroCreateInstance(int classID, int version, void** instance) {
    for (const pemaro::FactoryRow& row : pemaro::kFactory) {
        if (row.classID == classID && row.version == version) {
            *instance = row.make();
            return pemaro::STATUS_NO_ERROR;
        }
    }
    return pemaro::STATUS_BAD_PARAMETER;
}

int VEXPemaroCreateInstance(int classID, int version, void** instance) {
    return DURAPemaroCreateInstance(classID, version, instance);
}
