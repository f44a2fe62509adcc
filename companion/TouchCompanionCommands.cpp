// SPDX-License-Identifier: Apache-2.0
// TouchCompanionClient's commands: one-line commands, record filters and properties become request
// maps, and what the service answers is read back.
//
//   request   {OUTER:{"REQUEST":{"ACTION":action,"PARAMETERS":{...}}}}
//             OUTER is "DEBUG_COMMAND", or "PROPERTY_COMMAND" for a property
//   response  {OUTER:{"RESPONSE":{"RESULTS":result}}}
//             result is a number for a record filter, {"OUT_VALUE":n,"OUT_STRING":text} for a
//             command
//
// docs/commands.md shows each with an example.

#define LOG_TAG "TouchCompanionClient"

#include <log/log.h>

#include <cstdlib>
#include <cstring>

#include "companion/ClientFailure.h"
#include "companion/ResultText.h"
#include "pemaro/Status.h"
#include "pemaro/TouchCompanionClient.h"

namespace pemaro {

namespace {

using Service = ITouchCompanionService;

constexpr char kDebugCommand[] = "DEBUG_COMMAND";
constexpr char kPropertyCommand[] = "PROPERTY_COMMAND";
constexpr char kRollingLogProperty[] = "setRollingLogSize";

SerializableValue text(const char* characters) {
    return SerializableValue(std::string(characters));
}

SerializableMap makeRequest(const char* outer, const char* action,
                            const SerializableMap& parameters) {
    SerializableMap body;
    body.add("ACTION", text(action));
    body.add("PARAMETERS", parameters);
    SerializableMap command;
    command.add("REQUEST", body);
    SerializableMap request;
    request.add(outer, command);
    return request;
}

// The way to "RESULTS" is the same whatever it holds.
template <typename Result>
int readResults(SerializableMap& response, Result& result, const std::string& key) {
    SerializableMap outer;
    int status = response.valueFor(key).getValue(outer);
    if (status != STATUS_NO_ERROR) {
        return status;
    }
    SerializableMap body;
    status = outer.valueFor("RESPONSE").getValue(body);
    if (status != STATUS_NO_ERROR) {
        return status;
    }
    return body.valueFor("RESULTS").getValue(result);
}

// A number as the tools write it: 0x for hexadecimal, 0 for octal; whatever follows it is ignored,
// and what does not fit 32 bits loses its upper ones.
int parseNumber(const char* token, int base) {
    return static_cast<int>(strtol(token, nullptr, base));
}

}  // namespace

int copyResultText(const std::string& source, char** result, void* (*allocate)(size_t)) {
    const size_t size = source.size() + 1;
    *result = static_cast<char*>(allocate(size));
    if (*result == nullptr) {
        return STATUS_ERROR_ALLOCATING_MEMORY;
    }
    memcpy(*result, source.c_str(), size);
    return STATUS_NO_ERROR;
}

// The signatures that callers are compiled against take the key by value.
// NOLINTBEGIN(performance-unnecessary-value-param)
int TouchCompanionClient::getResultFromResponseCmd(SerializableMap& response, int& result,
                                                   std::string key) {
    return readResults(response, result, key);
}

int TouchCompanionClient::getResultFromResponseCmd(SerializableMap& response,
                                                   SerializableMap& result, std::string key) {
    return readResults(response, result, key);
}

int TouchCompanionClient::getResultFromResponseCmd(SerializableMap& response,
                                                   SerializableMapArray& result, std::string key) {
    return readResults(response, result, key);
}
// NOLINTEND(performance-unnecessary-value-param)

// The first character is part of the first token whatever it is. Each later token begins with the
// space that ended the one before, so two spaces in a row, or one at the end, make a token without
// digits: a 0.
int TouchCompanionClient::getToolCmdValue(char* text, SerializableMapArray& values, int& count) {
    const char* token = text;
    const char* position = text;
    do {
        ++position;
        while (*position != ' ' && *position != '\0') {
            ++position;
        }
        values.add(SerializableValue(parseNumber(std::string(token, position).c_str(), 0)));
        ++count;
        token = position;
    } while (*position != '\0');
    return STATUS_NO_ERROR;
}

int TouchCompanionClient::getToolCmdValue(char* text, int& value) {
    size_t length = 1;
    while (text[length] != '\0') {
        ++length;
    }
    value = parseNumber(std::string(text, length).c_str(), 16);
    return STATUS_NO_ERROR;
}

int TouchCompanionClient::sendCommand(SerializableMap& request, SerializableMap& response) {
    return callService(clientFailure("sendCommand failed"), mService, &Service::sendCommand,
                       request, response);
}

int TouchCompanionClient::sendCommand(const char* command, char** result) {
    ALOGD("sendCommand: char E");
    if (command == nullptr) {
        ALOGD("sendCommand: req null");
        return STATUS_UNKNOWN_ERROR;
    }
    std::string name(command);
    ALOGD("sendCommand:: req = %s\n", name.c_str());

    SerializableMap parameters;
    int count = 0;
    const size_t space = name.find(' ');
    if (space != std::string::npos) {
        SerializableMapArray values;
        getToolCmdValue(&name[space], values, count);
        parameters.add("VALUES", values);
        name.resize(space);
    }
    parameters.add("NUM_OF_ELEMENTS", count);
    parameters.add("SEND_COMMAND_NAME", name);

    SerializableMap request = makeRequest(kDebugCommand, "SEND_COMMAND", parameters);
    SerializableMap response;
    int status = callService(kUnloggedFailure, mService, &Service::sendCommand, request, response);
    if (status == STATUS_NO_ERROR) {
        status = readCommandResponse(response, result);
    }
    ALOGD("sendCommand: char X retval =%d", status);
    return status;
}

// "OUT_VALUE" only says whether there is a text; it does not limit it.
int TouchCompanionClient::readCommandResponse(SerializableMap& response, char** result) {
    SerializableMap results;
    int status = getResultFromResponseCmd(response, results, kDebugCommand);
    if (status != STATUS_NO_ERROR) {
        int copied = copyResultText("response failed", result, malloc);
        return copied == STATUS_NO_ERROR ? status : copied;
    }
    ALOGD("sendCommand: SUCCESS!! retval =%d\n", 0);
    std::string answer = "response success";
    int length = 0;
    if (results.valueFor("OUT_VALUE").getValue(length) == STATUS_NO_ERROR && length > 0) {
        answer.clear();
        results.valueFor("OUT_STRING").getValue(answer);
    }
    status = copyResultText(answer, result, malloc);
    ALOGD("sendCommand: SUCCESS!! used_len =%d\n", length);
    return status;
}

// The number under "RESULTS" is only logged: the filter is set whatever it says.
int TouchCompanionClient::setRecordFilter(unsigned int mask) {
    ALOGD("setRecordFilter: E");
    SerializableMap parameters;
    parameters.add("MASK", mask);
    SerializableMap request = makeRequest(kDebugCommand, "SET_RECORD_FILTER", parameters);
    SerializableMap response;
    int status = callService(kUnloggedFailure, mService, &Service::sendCommand, request, response);
    if (status == STATUS_NO_ERROR) {
        int result = 0;
        status = getResultFromResponseCmd(response, result, kDebugCommand);
        if (status == STATUS_NO_ERROR) {
            ALOGD("setRecordFilter: SUCCESS!! %d\n", result);
        }
    }
    ALOGD("setRecordFilter: X retval =%d", status);
    return status;
}

int TouchCompanionClient::setProperty(const char* name, const char* value) {
    ALOGD("setProperty: char E");
    if (name == nullptr || value == nullptr) {
        ALOGD("setProperty: name or value null");
        return STATUS_INVALID_COMMAND;
    }
    const std::string property(name);
    ALOGD("setProperty:: name = %s, value =%s\n", property.c_str(), value);
    if (property != kRollingLogProperty) {
        return STATUS_INVALID_COMMAND;
    }
    // A second NUL behind the text: the splitter looks at no first character, not even of an empty
    // text.
    std::string numbers(value);
    numbers.push_back('\0');
    SerializableMapArray values;
    int count = 0;
    getToolCmdValue(&numbers[0], values, count);
    SerializableMap parameters;
    parameters.add("VALUES", values);
    parameters.add("NUM_OF_ELEMENTS", count);
    parameters.add("SEND_COMMAND_NAME", property);

    SerializableMap request = makeRequest(kPropertyCommand, "STR_SET_ROLLINGLOG_SIZE", parameters);
    SerializableMap response;
    int status = callService(kUnloggedFailure, mService, &Service::sendCommand, request, response);
    ALOGD("setProperty: char X retval =%d", status);
    return status;
}

}  // namespace pemaro
