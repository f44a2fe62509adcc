// SPDX-License-Identifier: Apache-2.0
// The value model, its text form and the status codes.

#include <pemaro/zelkclient.h>

#include <cstring>
#include <string>

#include "Check.h"

namespace {

using namespace pemaro;

void useValue() {
    SerializableValue gain(1.25f);
    float number = 0;
    CHECK(gain.getValue(number) == STATUS_NO_ERROR && number == 1.25f);
    std::string text;
    CHECK(gain.getValue(text) == STATUS_NO_ERROR && text == "1.250000");
    CHECK(gain.getValue<std::string>() == "1.250000");

    SerializableValue other(std::string("pen"));
    gain.swap(other);
    CHECK(gain.serialize() == "pen");
    gain = other;
    CHECK(gain.serialize() == "1.250000");
    CHECK(SerializableValue(static_cast<unsigned char>(200)).serialize() == "200");
    CHECK(SerializableValue(static_cast<signed char>(-2)).serialize() == "-2");
    CHECK(SerializableValue(static_cast<unsigned short>(60000)).serialize() == "60000");
    CHECK(SerializableValue(static_cast<short>(-3)).serialize() == "-3");
    CHECK(SerializableValue(4000000000u).serialize() == "4000000000");
    CHECK(SerializableValue(true).serialize() == "true");
    CHECK(SerializableValue(std::string("7"), VALUE_TYPE_INT32).serialize() == "7");
}

void useMap() {
    SerializableMap inner;
    inner.add("x", 1);
    SerializableMapArray list;
    list.add(2);
    list.add(3);
    SerializableMap map;
    map.add("list", list);
    map.add("map", inner);
    map.add("name", std::string("pen"));
    const std::string text = map.serialize();
    CHECK(text == R"({"list":[2,3],"map":{"x":1},"name":"pen"})");

    SerializableMap copy;
    CHECK(copy.unserialize(text) == STATUS_NO_ERROR);
    CHECK(copy.size() == 3 && copy.contains("list") && !copy.contains(std::string("List")));
    CHECK(copy.getType("map") == VALUE_TYPE_OBJECT);
    CHECK(copy.editValueFor("map").getValue<SerializableMap>().serialize() == R"({"x":1})");
    CHECK(copy.editValueFor("list").getValue<SerializableMapArray>().serialize() == "[2,3]");
    std::string key;
    SerializableValue value;
    CHECK(copy.keyAt(2, key) == STATUS_NO_ERROR && key == "name");
    CHECK(copy.valueAt(2, value) == STATUS_NO_ERROR && value.serialize() == "pen");
    CHECK(copy.valueAt(3, value) == STATUS_BAD_PARAMETER);

    CHECK((inner + copy).size() == 4);
    inner += copy;
    CHECK(inner.size() == 4);
    CHECK(inner.clear() == STATUS_NO_ERROR && inner.size() == 0);
}

void useArray() {
    SerializableMapArray list;
    CHECK(list.unserialize("[1,2]") == STATUS_NO_ERROR);
    CHECK(list.set(0, SerializableValue(5)) == STATUS_NO_ERROR);
    CHECK(list.set(2, SerializableValue(5)) == STATUS_INDEX_OUT_OF_BOUNDS);
    const SerializableMapArray& constant = list;
    CHECK(list.get(0).serialize() == "5");
    int number = 0;
    CHECK(constant.get(1).getValue(number) == STATUS_NO_ERROR && number == 2);
    list.clear();
    CHECK(list.serialize() == "[]");
}

void useBlob() {
    SerializableBlob blob("abc", 3);
    SerializableBlob copy(blob);
    SerializableBlob assigned;
    assigned = copy;
    assigned.swap(blob);
    char bytes[3] = {};
    CHECK(assigned.getSize() == 3 && assigned.getValue(bytes, 3) == 3);
    CHECK(memcmp(bytes, "abc", 3) == 0 && assigned.serialize() == "blob");
    SerializableBlob read;
    CHECK(SerializableValue(assigned).getValue(read) == STATUS_NO_ERROR && read.getSize() == 3);
}

void useText() {
    CHECK(findValueType("-5") == VALUE_TYPE_UINT32);
    std::string padded = " a ";
    removeWhitesSpaces(padded);
    CHECK(padded == "a");
    char* colon = nullptr;
    std::string key;
    CHECK(findKey(R"("key":1)", &colon, key) == STATUS_NO_ERROR && key == "key");
    CHECK(strcmp(errStr(STATUS_TIMEOUT), "Timeout has occurred") == 0);
}

}  // namespace

void useValues() {
    useValue();
    useMap();
    useArray();
    useBlob();
    useText();
}
