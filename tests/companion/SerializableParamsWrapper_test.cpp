// SPDX-License-Identifier: Apache-2.0
// The parameter objects, as a caller has them: made by the factory, reached through their positions
// in the table of virtual functions.

#include "companion/SerializableParamsWrapper.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <climits>
#include <memory>
#include <string>

#include "tests/companion/FactoryObject.h"
#include "tests/support/LogLines.h"
#include "tests/support/VirtualSlot.h"

namespace pemaro::test {
namespace {

using ::testing::ElementsAre;
using ::testing::IsEmpty;

using Params4 = ISerializableParams4;
using Params3 = ISerializableParams3;

// What both interfaces have, by position. The destructor takes two, so position n counted from the
// destructor as the first is slot n.
template <typename Interface>
struct Slots {
    static int getClassID(Interface& p) { return (p.*memberAt<int (Interface::*)()>(2))(); }
    static int size(Interface& p) { return (p.*memberAt<int (Interface::*)()>(3))(); }
    static int keyAt(Interface& p, int index, std::string& key) {
        return (p.*memberAt<int (Interface::*)(int, std::string&)>(4))(index, key);
    }
    static int valueAt(Interface& p, int index, std::string& value) {
        return (p.*memberAt<int (Interface::*)(int, std::string&)>(5))(index, value);
    }
};

int getValue(Params4& p, const std::string& key, std::string& value) {
    return (p.*memberAt<int (Params4::*)(const std::string&, std::string&)>(6))(key, value);
}

int storeByPosition(Params4& p, std::string key, std::string value) {
    return (p.*memberAt<int (Params4::*)(std::string&, std::string&)>(7))(key, value);
}

int storeByPosition(Params3& p, std::string key, std::string value) {
    return (p.*memberAt<int (Params3::*)(std::string&, std::string&)>(6))(key, value);
}

SerializableMap& mapBehind(Params4& p) {
    return paramsBehind(&p);
}

// The facades are given either as if it were the current one.
SerializableMap& mapBehind(Params3& p) {
    return paramsBehind(reinterpret_cast<Params4*>(&p));
}

template <typename Interface>
class ParameterObject : public ::testing::Test {
  protected:
    using S = Slots<Interface>;
    static constexpr int kClassID = std::is_same_v<Interface, Params4> ? 4 : 3;

    void SetUp() override { clearLog(); }

    std::string keyAt(int index) {
        std::string key = "(none)";
        const int status = S::keyAt(*mParams, index, key);
        return status == 0 ? key : std::to_string(status) + key;
    }

    std::string valueAt(int index) {
        std::string value = "(none)";
        const int status = S::valueAt(*mParams, index, value);
        return status == 0 ? value : std::to_string(status) + value;
    }

    const std::unique_ptr<Interface> mParams = make<Interface>(kClassID);
};

using Interfaces = ::testing::Types<Params4, Params3>;
TYPED_TEST_SUITE(ParameterObject, Interfaces);

TYPED_TEST(ParameterObject, KnowsItsClass) {
    EXPECT_EQ(TestFixture::kClassID, TestFixture::S::getClassID(*this->mParams));
}

TYPED_TEST(ParameterObject, BeginsEmpty) {
    EXPECT_EQ(0, TestFixture::S::size(*this->mParams));
    EXPECT_EQ("1073741837(none)", this->keyAt(0));
}

TYPED_TEST(ParameterObject, HoldsOneEntryAfterOneStore) {
    EXPECT_EQ(0, storeByPosition(*this->mParams, "gain", "3"));
    EXPECT_EQ(1, TestFixture::S::size(*this->mParams));
    EXPECT_EQ("gain", this->keyAt(0));
    EXPECT_EQ("3", this->valueAt(0));
    EXPECT_EQ("1073741837(none)", this->keyAt(1));
    EXPECT_EQ("1073741837(none)", this->keyAt(-1));
    EXPECT_EQ("1073741837(none)", this->keyAt(INT_MIN));
    EXPECT_EQ("1073741837(none)", this->keyAt(INT_MAX));
}

TYPED_TEST(ParameterObject, SortsByKeyAndReplaces) {
    storeByPosition(*this->mParams, "b", "1");
    storeByPosition(*this->mParams, "a", "2");
    storeByPosition(*this->mParams, "B", "3");
    EXPECT_EQ(0, storeByPosition(*this->mParams, "b", "4"));
    EXPECT_EQ(3, TestFixture::S::size(*this->mParams));
    EXPECT_EQ("B=3", this->keyAt(0) + "=" + this->valueAt(0));
    EXPECT_EQ("a=2", this->keyAt(1) + "=" + this->valueAt(1));
    EXPECT_EQ("b=4", this->keyAt(2) + "=" + this->valueAt(2));
}

TYPED_TEST(ParameterObject, StoresStringsWhateverTheyLookLike) {
    for (const char* text : {"3", "true", "", "{\"a\":1}", "1.5"}) {
        EXPECT_EQ(0, storeByPosition(*this->mParams, "key", text));
        EXPECT_EQ(text, this->valueAt(0));
        EXPECT_EQ(VALUE_TYPE_STRING, mapBehind(*this->mParams).getType("key")) << text;
    }
}

TYPED_TEST(ParameterObject, ReadsNoTextOfAContainer) {
    mapBehind(*this->mParams).unserialize(R"({"a":[1],"m":{"x":1},"s":"text","t":true})");
    EXPECT_EQ(4, TestFixture::S::size(*this->mParams));
    EXPECT_EQ("1073741836(none)", this->valueAt(0));
    EXPECT_EQ("1073741836(none)", this->valueAt(1));
    EXPECT_EQ("text", this->valueAt(2));
    EXPECT_EQ("true", this->valueAt(3));
    EXPECT_THAT(linesOf("SerializableMap"), IsEmpty());
}

TYPED_TEST(ParameterObject, HasNoValueAtABadPosition) {
    storeByPosition(*this->mParams, "gain", "3");
    std::string value;
    EXPECT_DEATH(TestFixture::S::valueAt(*this->mParams, 1, value),
                 "index>=size\\(\\)\\|SerializableMap\\|.*: index=1 out of range \\(1\\)");
    EXPECT_DEATH(TestFixture::S::valueAt(*this->mParams, -1, value),
                 "index>=size\\(\\)\\|SerializableMap\\|.*: index=4294967295 out of range \\(1\\)");
}

// Slots 0 and 1 are the destructor, without and with the release of the memory: what is forgotten or
// released twice is found by AddressSanitizer.
TYPED_TEST(ParameterObject, IsDestroyedThroughItsTable) {
    std::unique_ptr<TypeParam> object = make<TypeParam>(TestFixture::kClassID);
    storeByPosition(*object, "key", std::string(1000, 'x'));
    TypeParam* const raw = object.release();
    (raw->*memberAt<void (TypeParam::*)()>(1))();
}

TYPED_TEST(ParameterObject, KeepsItsMapRightBehindTheTable) {
    storeByPosition(*this->mParams, "gain", "3");
    const char* const object = reinterpret_cast<const char*>(this->mParams.get());
    const char* const map = reinterpret_cast<const char*>(&mapBehind(*this->mParams));
    EXPECT_EQ(static_cast<ptrdiff_t>(sizeof(void*)), map - object);
    EXPECT_EQ(R"({"gain":"3"})", mapBehind(*this->mParams).serialize());
}

// ---- lookup by key, which the current interface alone has ----

class ParameterLookup : public ParameterObject<Params4> {};

TEST_F(ParameterLookup, ReadsTheTextUnderAKey) {
    storeByPosition(*mParams, "gain", "3");
    storeByPosition(*mParams, "name", "pen");
    std::string value;
    EXPECT_EQ(0, getValue(*mParams, "name", value));
    EXPECT_EQ("pen", value);
    EXPECT_THAT(linesOf("SerializableMap"), IsEmpty());
}

TEST_F(ParameterLookup, LogsThatAValueHasNoText) {
    mapBehind(*mParams).unserialize(R"({"m":{"x":1}})");
    std::string value = "before";
    EXPECT_EQ(0x4000000C, getValue(*mParams, "m", value));
    EXPECT_EQ("before", value);
    EXPECT_THAT(linesOf("SerializableMap"), ElementsAre("E error getting param: Invalid format"));
}

TEST_F(ParameterLookup, HasNoValueUnderAnAbsentKey) {
    storeByPosition(*mParams, "gain", "3");
    std::string value;
    EXPECT_DEATH(getValue(*mParams, "Gain", value), "i<0\\|SerializableMap\\|.*: key not found");
}

// ---- the interfaces as they are declared ----

TEST(ParameterInterfaces, DeclareTheirOperationsInTheOrderOfTheTable) {
    EXPECT_EQ(2, slotOf(&Params4::getClassID));
    EXPECT_EQ(3, slotOf(&Params4::size));
    EXPECT_EQ(4, slotOf(&Params4::getKeyAt));
    EXPECT_EQ(5, slotOf(&Params4::getValueAt));
    EXPECT_EQ(6, slotOf(&Params4::getValue));
    EXPECT_EQ(7, slotOf(&Params4::setValue));

    EXPECT_EQ(2, slotOf(&Params3::getClassID));
    EXPECT_EQ(3, slotOf(&Params3::size));
    EXPECT_EQ(4, slotOf(&Params3::getKey));
    EXPECT_EQ(5, slotOf(&Params3::getValue));
    EXPECT_EQ(6, slotOf(&Params3::setParam));
}

}  // namespace
}  // namespace pemaro::test
