// SPDX-License-Identifier: Apache-2.0
#include "simulator/companion/CommandInterpreter.h"

#include <algorithm>

#include "pemaro/SerializableMapArray.h"
#include "pemaro/Status.h"
#include "pemaro/Version.h"

namespace pemaro::simulator {
namespace {

constexpr const char* kDebug = "DEBUG_COMMAND";
constexpr const char* kProperty = "PROPERTY_COMMAND";
constexpr int kDefaultDumpBytes = 65536;
constexpr int kMaxDumpBytes = 262144;

/// The map under `key`; false when there is none.
bool getMap(const SerializableMap& from, const char* key, SerializableMap& map) {
    return from.valueFor(key).getValue(map) == STATUS_NO_ERROR;
}

/// A string value arrives with a string's tag; any other is no name.
bool getText(const SerializableMap& from, const char* key, std::string& text) {
    SerializableMap copy = from;
    return copy.getType(key) == VALUE_TYPE_STRING &&
           from.valueFor(key).getValue(text) == STATUS_NO_ERROR;
}

/// The numbers of PARAMETERS, as many as NUM_OF_ELEMENTS tells.
bool getNumbers(const SerializableMap& params, std::vector<int>& numbers) {
    int count = 0;
    if (params.valueFor("NUM_OF_ELEMENTS").getValue(count) != STATUS_NO_ERROR || count < 0) {
        return false;
    }
    SerializableMapArray values;
    params.valueFor("VALUES").getValue(values);
    // An array does not tell its length; its text does: one more element than separators. A text
    // among the elements may hold separators of its own, and is no number anyway.
    const std::string text = values.serialize();
    if (text.find_first_of("\"{") != std::string::npos || text.find('[', 1) != std::string::npos) {
        return false;
    }
    const auto present = text == "[]" ? 0 : 1 + std::count(text.begin(), text.end(), ',');
    if (present != count) {
        return false;
    }
    for (int i = 0; i < count; ++i) {
        int number = 0;
        const SerializableMapArray& elements = values;
        if (elements.get(i).getValue(number) != STATUS_NO_ERROR) {
            return false;
        }
        numbers.push_back(number);
    }
    return true;
}

std::string joinLines(const std::vector<std::string>& lines) {
    std::string text;
    for (const std::string& line : lines) {
        text += (text.empty() ? "" : "\n") + line;
    }
    return text;
}

SerializableMap wrapResults(const char* outer, const SerializableValue& results) {
    SerializableMap body;
    body.add("RESULTS", results);
    SerializableMap wrapped;
    wrapped.add("RESPONSE", body);
    SerializableMap response;
    response.add(outer, wrapped);
    return response;
}

}  // namespace

int CommandInterpreter::answer(const SerializableMap& request, SerializableMap& response) {
    const bool isProperty = request.indexOfKey(kProperty) >= 0;
    SerializableMap command;
    SerializableMap body;
    if (!getMap(request, isProperty ? kProperty : kDebug, command) ||
        !getMap(command, "REQUEST", body)) {
        return STATUS_INVALID_FORMAT;
    }
    return isProperty ? answerProperty(body, response) : answerDebug(body, response);
}

int CommandInterpreter::answerDebug(const SerializableMap& body, SerializableMap& response) {
    std::string action;
    SerializableMap params;
    if (!getText(body, "ACTION", action) || !getMap(body, "PARAMETERS", params)) {
        return STATUS_INVALID_FORMAT;
    }
    if (action == "SET_RECORD_FILTER") {
        unsigned int mask = 0;
        if (params.valueFor("MASK").getValue(mask) != STATUS_NO_ERROR) {
            return STATUS_ERROR_PARSING_PARAMETER;
        }
        mDevice.setFilter(mask);
        response = wrapResults(kDebug, 0);
        return STATUS_NO_ERROR;
    }
    if (action == "SET_CONFIG") {
        const int status = mDevice.configuration().set(params);
        if (status == STATUS_NO_ERROR) {
            response = wrapResults(kDebug, 0);
        }
        return status;
    }
    std::string name;
    std::vector<int> numbers;
    if (action != "SEND_COMMAND") {
        return STATUS_INVALID_COMMAND;
    }
    if (!getText(params, "SEND_COMMAND_NAME", name) || !getNumbers(params, numbers)) {
        return STATUS_ERROR_PARSING_PARAMETER;
    }
    std::string text;
    const int status = runCommand(name, numbers, &text);
    if (status == STATUS_NO_ERROR) {
        SerializableMap results;
        results.add("OUT_STRING", text);
        results.add("OUT_VALUE", static_cast<int>(text.size()));
        response = wrapResults(kDebug, results);
    }
    return status;
}

int CommandInterpreter::answerProperty(const SerializableMap& body, SerializableMap& response) {
    std::string action;
    SerializableMap params;
    std::vector<int> numbers;
    if (!getText(body, "ACTION", action) || action != "STR_SET_ROLLINGLOG_SIZE") {
        return STATUS_INVALID_COMMAND;
    }
    if (!getMap(body, "PARAMETERS", params) || !getNumbers(params, numbers)) {
        return STATUS_ERROR_PARSING_PARAMETER;
    }
    if (numbers.size() != 1) {
        return STATUS_INVALID_ARGUMENTS;
    }
    const int status = mDevice.setRollingLogSize(numbers[0]);
    if (status == STATUS_NO_ERROR) {
        // Nobody looks at it, but a response without entries could not be read.
        response = wrapResults(kProperty, 0);
    }
    return status;
}

int CommandInterpreter::runCommand(const std::string& name, const std::vector<int>& numbers,
                                   std::string* text) {
    if (name == "calibrate") {
        mDevice.configuration().calibrate(numbers.empty() ? 0 : numbers[0]);
        *text = "done";
    } else if (name == "status") {
        *text = "filter=" + std::to_string(mDevice.filter()) +
                " events=" + std::to_string(mDevice.events()) +
                " authenticated=" + (mDevice.isAuthenticated() ? "yes" : "no");
    } else if (name == "version") {
        *text = "zelk-touchstack " ZELK_VERSION;
    } else if (name == "selftest") {
        *text = selftest();
    } else if (name == "factoryreset") {
        return mDevice.resetToFactory();
    } else if (name == "dump") {
        const int bytes = numbers.empty() ? kDefaultDumpBytes : numbers[0];
        if (bytes < 0 || bytes > kMaxDumpBytes) {
            return STATUS_BAD_PARAMETER;
        }
        for (int i = 0; i < bytes; ++i) {
            *text += static_cast<char>('a' + i % 26);
        }
    } else if (name == "keys") {
        *text = joinLines(mDevice.configuration().keys());
    } else if (name == "sessions") {
        *text = joinLines(mDevice.sessions());
    } else if (name == "fail") {
        return STATUS_ERROR_AFE_HAL;
    } else if (mStates.count(name) != 0) {
        *text = joinLines(mStates.at(name)());
    } else {
        return STATUS_INVALID_COMMAND;
    }
    return STATUS_NO_ERROR;
}

std::string CommandInterpreter::selftest() const {
    Configuration copy = mDevice.configuration();
    const std::string binary = copy.toBinary();
    const bool intact = copy.fromBinary(binary.data(), binary.size()) == STATUS_NO_ERROR;
    return std::string("configuration: ") + (intact ? "intact" : "corrupt") +
           "\nanalog front end: " + std::to_string(mDevice.afe().size()) + " parameters" +
           "\nselftest: " + (intact ? "passed" : "failed");
}

}  // namespace pemaro::simulator
