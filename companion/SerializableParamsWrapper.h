// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>

#include "pemaro/ISerializableParams3.h"
#include "pemaro/ISerializableParams4.h"
#include "pemaro/SerializableMap.h"

namespace pemaro {

// The parameter objects of the factory: a map behind an interface of texts. A companion facade
// reads the map directly, whichever of the two it is given, so both keep it at the same place,
// right behind the pointer to the table of virtual functions; paramsBehind() relies on it.

class SerializableParamsWrapper : public ISerializableParams4 {
  public:
    int getClassID() override;
    int size() override;
    int getKeyAt(int index, std::string& key) override;
    int getValueAt(int index, std::string& value) override;
    int getValue(const std::string& key, std::string& value) override;
    int setValue(std::string& key, std::string& value) override;

  private:
    SerializableMap mParams;
};

class SerializableParamsWrapperOld : public ISerializableParams3 {
  public:
    int getClassID() override;
    int size() override;
    int getKey(int index, std::string& key) override;
    int getValue(int index, std::string& value) override;
    int setParam(std::string& key, std::string& value) override;

  private:
    SerializableMap mParams;
};

constexpr size_t kParamsOffset = sizeof(void*);

static_assert(sizeof(SerializableParamsWrapper) == kParamsOffset + sizeof(SerializableMap),
              "the map is not where the facades look for it");
static_assert(sizeof(SerializableParamsWrapperOld) == kParamsOffset + sizeof(SerializableMap),
              "the map is not where the facades look for it");

/// The map inside a parameter object of either kind.
inline SerializableMap& paramsBehind(ISerializableParams4* params) {
    return *reinterpret_cast<SerializableMap*>(reinterpret_cast<char*>(params) + kParamsOffset);
}

}  // namespace pemaro
