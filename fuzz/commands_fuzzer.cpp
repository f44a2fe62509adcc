// SPDX-License-Identifier: Apache-2.0

// One-line commands and properties of any text, answered with a response of any text. The request that
// crosses is compared with one that is written here the plain way, and so is the text that the caller gets.

#include <fuzzer/FuzzedDataProvider.h>

#include <algorithm>
#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <string>

#include "fuzz/support/ParcelInput.h"
#include "pemaro/Status.h"
#include "pemaro/TouchCompanionClient.h"
#include "pemaro/testkit/FakeServiceManager.h"
#include "pemaro/testkit/FakeTouchCompanionService.h"
#include "pemaro/testkit/NativeBinder.h"
#include "tests/values/reference/ReferenceTree.h"

namespace {

using namespace pemaro;
using android::sp;
using reference::Tree;

constexpr size_t kLongestText = 512;

/// Keeps the request and answers as the input says.
class Service : public test::FakeTouchCompanionService {
  public:
    int sendCommand(SerializableMap& received, SerializableMap& answer) override {
        request = received.serialize();
        if (status == 0) {
            answer.unserialize(responseText);
            tree = reference::treeOf(answer);
        }
        return status;
    }

    int status = 0;
    std::string responseText;
    std::string request;
    Tree tree;
};

struct Connection {
    test::ScopedServiceManager services;
    sp<Service> service = new Service;
    sp<TouchCompanionClient> client = new TouchCompanionClient;

    Connection() {
        services->add("pemaro.TouchService", service);
        fuzz::expect(client->init() == 0, "init");
    }
};

/// The list that a property's value stands for: each space ends a number, but not one that is the very first
/// character.
std::string numbers(const std::string& list, int& count) {
    std::string text = "[";
    size_t start = 0;
    count = 0;
    for (;;) {
        const size_t end = list.find(' ', std::max<size_t>(start, 1));
        const std::string number = list.substr(start, end == std::string::npos ? end : end - start);
        text += (count == 0 ? "" : ",");
        text += std::to_string(static_cast<int>(strtol(number.c_str(), nullptr, 0)));
        count += 1;
        if (end == std::string::npos) {
            return text + "]";
        }
        start = end + 1;
    }
}

std::string requestText(const char* outer, const char* action, const std::string& parameters) {
    return std::string("{\"") + outer + "\":{\"REQUEST\":{\"ACTION\":\"" + action +
           "\",\"PARAMETERS\":{" + parameters + "}}}}";
}

std::string parameters(const std::string& name, int count, const std::string& values) {
    return "\"NUM_OF_ELEMENTS\":" + std::to_string(count) + ",\"SEND_COMMAND_NAME\":\"" + name +
           "\"" + (values.empty() ? "" : ",\"VALUES\":" + values);
}

/// The value under a key, or null.
const Tree* find(const Tree* tree, const char* key) {
    if (tree == nullptr || tree->type != VALUE_TYPE_OBJECT) {
        return nullptr;
    }
    for (const auto& [name, value] : tree->entries) {
        if (name == key) {
            return &value;
        }
    }
    return nullptr;
}

const Tree* results(Tree& response) {
    response.type = VALUE_TYPE_OBJECT;
    return find(find(find(&response, "DEBUG_COMMAND"), "RESPONSE"), "RESULTS");
}

bool isContainer(const Tree& tree) {
    return tree.type == VALUE_TYPE_OBJECT || tree.type == VALUE_TYPE_ARRAY;
}

int number(const Tree* value) {
    int result = 0;
    if (value != nullptr && !isContainer(*value)) {
        SerializableValue(value->text, value->type).getValue(result);
    }
    return result;
}

/// What the caller of a command gets.
int expectedAnswer(Tree& response, std::string& text) {
    const Tree* found = results(response);
    if (found == nullptr || found->type != VALUE_TYPE_OBJECT) {
        text = "response failed";
        return STATUS_INVALID_FORMAT;
    }
    text = "response success";
    if (number(find(found, "OUT_VALUE")) > 0) {
        const Tree* string = find(found, "OUT_STRING");
        text = string == nullptr || isContainer(*string) ? "" : string->text;
    }
    return STATUS_NO_ERROR;
}

void checkCommand(Connection& on, const std::string& command) {
    const size_t space = command.find(' ');
    int count = 0;
    const std::string values =
            space == std::string::npos ? "" : numbers(command.substr(space), count);
    char* answer = nullptr;
    const int status = on.client->sendCommand(command.c_str(), &answer);
    fuzz::expect(
            on.service->request == requestText("DEBUG_COMMAND", "SEND_COMMAND",
                                               parameters(command.substr(0, space), count, values)),
            "another request was sent");
    if (on.service->status != 0) {
        fuzz::expect(status == on.service->status && answer == nullptr, "a refusal was answered");
        return;
    }
    std::string expected;
    fuzz::expect(status == expectedAnswer(on.service->tree, expected), "another status");
    // A C string ends at its first NUL.
    fuzz::expect(answer != nullptr && strcmp(answer, expected.c_str()) == 0, "another answer");
    free(answer);
}

void checkProperty(Connection& on, const std::string& value) {
    int count = 0;
    const std::string values = numbers(value, count);
    fuzz::expect(on.client->setProperty("setRollingLogSize", value.c_str()) == on.service->status,
                 "another status");
    fuzz::expect(on.service->request == requestText("PROPERTY_COMMAND", "STR_SET_ROLLINGLOG_SIZE",
                                                    parameters("setRollingLogSize", count, values)),
                 "another request was sent");
}

void checkFilter(Connection& on, unsigned int mask) {
    const int status = on.client->setRecordFilter(mask);
    fuzz::expect(on.service->request == requestText("DEBUG_COMMAND", "SET_RECORD_FILTER",
                                                    "\"MASK\":" + std::to_string(mask)),
                 "another request was sent");
    if (on.service->status != 0) {
        fuzz::expect(status == on.service->status, "another status");
        return;
    }
    const Tree* found = results(on.service->tree);
    int value = 0;
    const bool readable = found != nullptr && !isContainer(*found) &&
                          SerializableValue(found->text, found->type).getValue(value) == 0;
    fuzz::expect(status == (readable ? STATUS_NO_ERROR : STATUS_INVALID_FORMAT), "another status");
}

std::string cText(FuzzedDataProvider& input) {
    return input.ConsumeRandomLengthString(kLongestText).c_str();
}

}  // namespace

extern "C" int LLVMFuzzerInitialize(int*, char***) {
    pemaro::test::openDriver();
    return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    static auto& on = *new Connection;
    FuzzedDataProvider input(data, size);
    const int operation = input.ConsumeIntegralInRange(0, 3);
    on.service->status = input.ConsumeIntegralInRange(0, 7) == 0 ? STATUS_TIMEOUT : 0;
    const std::string text = cText(input);
    on.service->responseText = cText(input);
    if (fuzz::isFatalText(on.service->responseText)) {
        return -1;
    }
    if (operation == 0) {
        checkProperty(on, text);
    } else if (operation == 1) {
        checkFilter(on, input.ConsumeIntegral<unsigned int>());
    } else {
        checkCommand(on, text);
    }
    return 0;
}
