// SPDX-License-Identifier: Apache-2.0
#include "simulator/companion/CommandInterpreter.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <string>

#include "pemaro/Status.h"
#include "pemaro/Version.h"

namespace pemaro::simulator {

namespace {

// A request as the client sends it for a command with numbers, told as in a list.
std::string command(const std::string& name, const std::string& numbers = "") {
    const long count = numbers.empty() ? 0 : 1 + std::count(numbers.begin(), numbers.end(), ',');
    const std::string values = numbers.empty() ? "" : ",\"VALUES\":[" + numbers + "]";
    return "{\"DEBUG_COMMAND\":{\"REQUEST\":{\"ACTION\":\"SEND_COMMAND\",\"PARAMETERS\":{"
           "\"NUM_OF_ELEMENTS\":" +
           std::to_string(count) + ",\"SEND_COMMAND_NAME\":\"" + name + "\"" + values + "}}}}";
}

std::string property(const std::string& parameters) {
    return "{\"PROPERTY_COMMAND\":{\"REQUEST\":{\"ACTION\":\"STR_SET_ROLLINGLOG_SIZE\","
           "\"PARAMETERS\":" +
           parameters + "}}}";
}

std::string results(const std::string& text) {
    return "{\"DEBUG_COMMAND\":{\"RESPONSE\":{\"RESULTS\":{\"OUT_STRING\":\"" + text +
           "\",\"OUT_VALUE\":" + std::to_string(text.size()) + "}}}}";
}

class CommandInterpreterTest : public ::testing::Test {
  protected:
    int answer(const std::string& text) {
        SerializableMap request;
        EXPECT_EQ(0, request.unserialize(text)) << text;
        response = SerializableMap();
        return interpreter.answer(request, response);
    }

    Device device{"secret"};
    CommandInterpreter interpreter{device};
    SerializableMap response;
};

}  // namespace

TEST_F(CommandInterpreterTest, AnswersItsCommands) {
    const struct {
        std::string request;
        std::string text;
    } rows[] = {
            {command("calibrate", "3,16"), "done"},
            {command("calibrate"), "done"},
            {command("version"), "zelk-touchstack " ZELK_VERSION},
            {command("keys"),
             "device.name\nedge.zones\ngain\nnoise.threshold\npalm.rejection\npanel.size\n"
             "report.rate\ntouch.threshold"},
            {command("sessions"), ""},
            {command("status"), "filter=3 events=0 authenticated=no"},
            {command("selftest"),
             "configuration: intact\nanalog front end: 3 parameters\nselftest: passed"},
            {command("dump", "5"), "abcde"},
    };
    for (const auto& row : rows) {
        EXPECT_EQ(0, answer(row.request)) << row.request;
        EXPECT_EQ(results(row.text), response.serialize());
    }
}

TEST_F(CommandInterpreterTest, ListsTheSessions) {
    device.saveSession();
    device.saveSession();
    EXPECT_EQ(0, answer(command("sessions")));
    EXPECT_EQ(results("1\n2"), response.serialize());
}

TEST_F(CommandInterpreterTest, TellsTheStateOfTheServicesBesideIt) {
    CommandInterpreter more(device,
                            {{"handstate", [] {
                                  return std::vector<std::string>{"activity=idle", "wakeup=off"};
                              }}});
    SerializableMap request;
    EXPECT_EQ(0, request.unserialize(command("handstate")));
    EXPECT_EQ(0, more.answer(request, response));
    EXPECT_EQ(results("activity=idle\nwakeup=off"), response.serialize());
    EXPECT_EQ(STATUS_INVALID_COMMAND, answer(command("handstate")));
}

TEST_F(CommandInterpreterTest, SetsValuesOfTheConfigurationAllOrNone) {
    const auto set = [](const std::string& values) {
        return "{\"DEBUG_COMMAND\":{\"REQUEST\":{\"ACTION\":\"SET_CONFIG\",\"PARAMETERS\":" +
               values + "}}}";
    };
    const auto gain = [this] {
        SerializableMap values;
        values.add("gain", std::string("?"));
        device.configuration().get(values);
        return values.serialize();
    };
    EXPECT_EQ(STATUS_ERROR_PARSING_CONFIGURATION_SETTING,
              answer(set("{\"gain\":2.5,\"volume\":3}")));
    EXPECT_EQ("{\"gain\":1.500000}", gain());
    EXPECT_EQ(0, answer(set("{\"gain\":2.5,\"noise.threshold\":3}")));
    EXPECT_EQ("{\"gain\":2.5}", gain());
}

// What VALUES hold are numbers; a text with separators of its own is none of several.
TEST_F(CommandInterpreterTest, RefusesTextsAmongNumbers) {
    const auto request = [](const char* count, const char* values) {
        return std::string(
                       "{\"DEBUG_COMMAND\":{\"REQUEST\":{\"ACTION\":\"SEND_COMMAND\","
                       "\"PARAMETERS\":{\"NUM_OF_ELEMENTS\":") +
               count + ",\"SEND_COMMAND_NAME\":\"calibrate\",\"VALUES\":" + values + "}}}}";
    };
    EXPECT_EQ(STATUS_ERROR_PARSING_PARAMETER, answer(request("2", "[\"1,2\"]")));
    EXPECT_EQ(STATUS_ERROR_PARSING_PARAMETER, answer(request("3", "[\"1,2\",3]")));
    EXPECT_EQ(STATUS_ERROR_PARSING_PARAMETER, answer(request("2", "[[1,2]]")));
    EXPECT_EQ(STATUS_ERROR_PARSING_PARAMETER, answer(request("2", "[{\"a\":1,\"b\":2}]")));
}

TEST_F(CommandInterpreterTest, CalibratesTheConfiguration) {
    const std::string before = device.configuration().toBinary();
    EXPECT_EQ(0, answer(command("calibrate", "3")));
    EXPECT_NE(before, device.configuration().toBinary());
}

TEST_F(CommandInterpreterTest, GivesLongAnswers) {
    EXPECT_EQ(0, answer(command("dump")));
    EXPECT_GT(response.serialize().size(), 65536u);
    EXPECT_EQ(0, answer(command("dump", "262144")));
    EXPECT_EQ(STATUS_BAD_PARAMETER, answer(command("dump", "262145")));
    EXPECT_EQ(STATUS_BAD_PARAMETER, answer(command("dump", "-1")));
}

TEST_F(CommandInterpreterTest, AnswersWithoutATextByTheLengthZero) {
    EXPECT_EQ(0, device.authenticate("secret"));
    EXPECT_EQ(0, answer(command("factoryreset")));
    EXPECT_EQ(results(""), response.serialize());
}

TEST_F(CommandInterpreterTest, SetsTheRecordFilter) {
    EXPECT_EQ(0, answer("{\"DEBUG_COMMAND\":{\"REQUEST\":{\"ACTION\":\"SET_RECORD_FILTER\","
                        "\"PARAMETERS\":{\"MASK\":31}}}}"));
    EXPECT_EQ("{\"DEBUG_COMMAND\":{\"RESPONSE\":{\"RESULTS\":0}}}", response.serialize());
    EXPECT_EQ(31u, device.filter());
}

TEST_F(CommandInterpreterTest, SetsTheRollingLogSize) {
    EXPECT_EQ(0, answer(property("{\"NUM_OF_ELEMENTS\":1,\"SEND_COMMAND_NAME\":"
                                 "\"setRollingLogSize\",\"VALUES\":[1024]}")));
    // Nobody reads this, but a client refuses a response without entries.
    EXPECT_EQ("{\"PROPERTY_COMMAND\":{\"RESPONSE\":{\"RESULTS\":0}}}", response.serialize());
    EXPECT_NE(std::string::npos, device.properties().serialize().find("\"rollingLogSize\":1024"));
}

TEST_F(CommandInterpreterTest, RefusesWhatItDoesNotUnderstand) {
    const struct {
        std::string request;
        int status;
    } rows[] = {
            {"{\"OTHER\":1}", STATUS_INVALID_FORMAT},
            {"{\"DEBUG_COMMAND\":1}", STATUS_INVALID_FORMAT},
            {"{\"DEBUG_COMMAND\":{\"X\":1}}", STATUS_INVALID_FORMAT},
            {"{\"DEBUG_COMMAND\":{\"REQUEST\":{\"X\":1}}}", STATUS_INVALID_FORMAT},
            {"{\"DEBUG_COMMAND\":{\"REQUEST\":{\"ACTION\":\"X\",\"PARAMETERS\":{\"X\":1}}}}",
             STATUS_INVALID_COMMAND},
            {"{\"DEBUG_COMMAND\":{\"REQUEST\":{\"ACTION\":5,\"PARAMETERS\":{\"X\":1}}}}",
             STATUS_INVALID_FORMAT},
            {"{\"DEBUG_COMMAND\":{\"REQUEST\":{\"ACTION\":\"SEND_COMMAND\",\"PARAMETERS\":{\"X\":1}"
             "}}}",
             STATUS_ERROR_PARSING_PARAMETER},
            {"{\"DEBUG_COMMAND\":{\"REQUEST\":{\"ACTION\":\"SEND_COMMAND\",\"PARAMETERS\":"
             "{\"NUM_OF_ELEMENTS\":2,\"SEND_COMMAND_NAME\":\"status\",\"VALUES\":[1]}}}}",
             STATUS_ERROR_PARSING_PARAMETER},
            {"{\"DEBUG_COMMAND\":{\"REQUEST\":{\"ACTION\":\"SEND_COMMAND\",\"PARAMETERS\":"
             "{\"NUM_OF_ELEMENTS\":1,\"SEND_COMMAND_NAME\":\"status\",\"VALUES\":[x]}}}}",
             STATUS_ERROR_PARSING_PARAMETER},
            {"{\"DEBUG_COMMAND\":{\"REQUEST\":{\"ACTION\":\"SET_RECORD_FILTER\","
             "\"PARAMETERS\":{\"X\":1}}}}",
             STATUS_ERROR_PARSING_PARAMETER},
            {command("dance"), STATUS_INVALID_COMMAND},
            {command(""), STATUS_INVALID_COMMAND},
            {command("fail"), STATUS_ERROR_AFE_HAL},
            {command("factoryreset"), STATUS_INVALID_STATE},
            {property("{\"X\":1}"), STATUS_ERROR_PARSING_PARAMETER},
            {property("{\"NUM_OF_ELEMENTS\":2,\"VALUES\":[1,2]}"), STATUS_INVALID_ARGUMENTS},
            {property("{\"NUM_OF_ELEMENTS\":1,\"VALUES\":[-1]}"), STATUS_BAD_PARAMETER},
            {"{\"PROPERTY_COMMAND\":{\"REQUEST\":{\"ACTION\":\"X\",\"PARAMETERS\":{\"X\":1}}}}",
             STATUS_INVALID_COMMAND},
    };
    for (const auto& row : rows) {
        EXPECT_EQ(row.status, answer(row.request)) << row.request;
        EXPECT_EQ("{}", response.serialize()) << row.request;
    }
}

}  // namespace pemaro::simulator
