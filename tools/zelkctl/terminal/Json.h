// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <rapidjson/stringbuffer.h>
#include <rapidjson/writer.h>

#include <chrono>
#include <cstdint>
#include <string>
#include <vector>

namespace pemaro::zelkctl {

class JsonArray;

/// Whether a text is a JSON value and nothing else.
bool isJson(const std::string& text);

/// A JSON object on one line, its members in the order in which they are added.
///
///     JsonObject().add("session", 3).text()    // {"session":3}
class JsonObject {
  public:
    JsonObject() : mWriter(mBuffer) { mWriter.StartObject(); }

    JsonObject& add(const std::string& name, int64_t value);
    /// Bytes that are no UTF-8 are replaced, each by U+FFFD: JSON has no place for them.
    JsonObject& add(const std::string& name, const std::string& value);
    JsonObject& add(const std::string& name, const std::vector<std::string>& values);
    JsonObject& add(const std::string& name, const std::vector<int64_t>& values);
    /// Objects within the object.
    JsonObject& add(const std::string& name, JsonObject& object);
    JsonObject& add(const std::string& name, JsonArray& array);
    /// To the sixth decimal place. REQUIRES: it is finite.
    JsonObject& addReal(const std::string& name, double value);
    /// A text that is JSON itself as what it is, on one line; any other as a text.
    JsonObject& addParsed(const std::string& name, const std::string& text);
    JsonObject& addFlag(const std::string& name, bool value);
    /// Seconds since 1970, to the millisecond.
    JsonObject& addTime(const std::string& name, std::chrono::system_clock::time_point when);

    /// The whole object; nothing can be added any more.
    std::string text();

  private:
    void addName(const std::string& name);
    void addText(const std::string& bytes);

    rapidjson::StringBuffer mBuffer;
    rapidjson::Writer<rapidjson::StringBuffer> mWriter;
};

/// A JSON array of objects on one line.
class JsonArray {
  public:
    JsonArray() : mWriter(mBuffer) { mWriter.StartArray(); }

    JsonArray& add(JsonObject& object);

    /// The whole array; nothing can be added any more.
    std::string text();

  private:
    rapidjson::StringBuffer mBuffer;
    rapidjson::Writer<rapidjson::StringBuffer> mWriter;
};

}  // namespace pemaro::zelkctl
