// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/terminal/Json.h"

#include <fmt/core.h>
#include <rapidjson/encodings.h>
#include <rapidjson/memorystream.h>
#include <rapidjson/reader.h>

#include <algorithm>
#include <cmath>

namespace pemaro::zelkctl {
namespace {

std::string asUtf8(const std::string& bytes) {
    using Utf8 = rapidjson::UTF8<>;
    std::string text;
    for (size_t i = 0; i < bytes.size();) {
        rapidjson::MemoryStream rest(&bytes[i], bytes.size() - i);
        rapidjson::StringBuffer character;
        if (Utf8::Validate(rest, character) && rest.Tell() <= bytes.size() - i) {
            text.append(character.GetString(), character.GetSize());
            i += rest.Tell();
        } else {
            text += "\xEF\xBF\xBD";
            i += 1;
        }
    }
    return text;
}

}  // namespace

bool isJson(const std::string& text) {
    // The reader takes a NUL for the text's end and would look at nothing behind it.
    if (text.find('\0') != std::string::npos) {
        return false;
    }
    // Read step by step: a text from elsewhere may be nested deeper than the stack.
    constexpr unsigned kFlags =
            rapidjson::kParseIterativeFlag | rapidjson::kParseValidateEncodingFlag;
    rapidjson::Reader reader;
    rapidjson::MemoryStream stream(text.data(), text.size());
    rapidjson::BaseReaderHandler<> nobody;
    return !reader.Parse<kFlags>(stream, nobody).IsError();
}

void JsonObject::addName(const std::string& name) {
    const std::string text = asUtf8(name);
    mWriter.Key(text.data(), static_cast<rapidjson::SizeType>(text.size()));
}

JsonObject& JsonObject::add(const std::string& name, int64_t value) {
    addName(name);
    mWriter.Int64(value);
    return *this;
}

JsonObject& JsonObject::add(const std::string& name, const std::string& value) {
    addName(name);
    addText(value);
    return *this;
}

JsonObject& JsonObject::add(const std::string& name, const std::vector<std::string>& values) {
    addName(name);
    mWriter.StartArray();
    for (const std::string& value : values) {
        addText(value);
    }
    mWriter.EndArray();
    return *this;
}

JsonObject& JsonObject::add(const std::string& name, const std::vector<int64_t>& values) {
    addName(name);
    mWriter.StartArray();
    for (const int64_t value : values) {
        mWriter.Int64(value);
    }
    mWriter.EndArray();
    return *this;
}

JsonObject& JsonObject::add(const std::string& name, JsonObject& object) {
    addName(name);
    const std::string text = object.text();
    mWriter.RawValue(text.data(), text.size(), rapidjson::kObjectType);
    return *this;
}

JsonObject& JsonObject::add(const std::string& name, JsonArray& array) {
    addName(name);
    const std::string text = array.text();
    mWriter.RawValue(text.data(), text.size(), rapidjson::kArrayType);
    return *this;
}

JsonObject& JsonObject::addReal(const std::string& name, double value) {
    addName(name);
    mWriter.Double(std::round(value * 1e6) / 1e6);
    return *this;
}

JsonObject& JsonObject::addParsed(const std::string& name, const std::string& text) {
    if (!isJson(text)) {
        return add(name, text);
    }
    // An end of line stands between tokens only, where a blank is as good and keeps the object on one line.
    std::string line = text;
    std::replace_if(
            line.begin(), line.end(), [](char c) { return c == '\n' || c == '\r'; }, ' ');
    addName(name);
    mWriter.RawValue(line.data(), line.size(), rapidjson::kObjectType);
    return *this;
}

JsonObject& JsonObject::addFlag(const std::string& name, bool value) {
    addName(name);
    mWriter.Bool(value);
    return *this;
}

JsonObject& JsonObject::addTime(const std::string& name,
                                std::chrono::system_clock::time_point when) {
    const auto since = std::chrono::floor<std::chrono::milliseconds>(when).time_since_epoch();
    const std::string seconds = fmt::format("{}.{:03}", since.count() / 1000, since.count() % 1000);
    addName(name);
    mWriter.RawValue(seconds.data(), seconds.size(), rapidjson::kNumberType);
    return *this;
}

void JsonObject::addText(const std::string& bytes) {
    const std::string text = asUtf8(bytes);
    mWriter.String(text.data(), static_cast<rapidjson::SizeType>(text.size()));
}

std::string JsonObject::text() {
    mWriter.EndObject();
    return mBuffer.GetString();
}

JsonArray& JsonArray::add(JsonObject& object) {
    const std::string text = object.text();
    mWriter.RawValue(text.data(), text.size(), rapidjson::kObjectType);
    return *this;
}

std::string JsonArray::text() {
    mWriter.EndArray();
    return mBuffer.GetString();
}

}  // namespace pemaro::zelkctl
