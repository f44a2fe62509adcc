// SPDX-License-Identifier: Apache-2.0
// Commands, record filters and properties of TouchCompanionClient, and the two readers of numbers.

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cstdlib>
#include <memory>
#include <string>
#include <thread>
#include <utility>
#include <vector>

#include "tests/companion/TouchCompanionRemoteTest.h"

namespace pemaro::test {
namespace {

using android::sp;
using ::testing::ElementsAre;
using ::testing::IsEmpty;

constexpr uint32_t kSendCommandCode = 25;

// What a command leaves behind: its status, and the text or that there is none.
struct Answer {
    int status;
    std::string text;
};

bool operator==(const Answer& a, const Answer& b) {
    return a.status == b.status && a.text == b.text;
}

void PrintTo(const Answer& answer, std::ostream* out) {
    *out << std::hex << answer.status << " \"" << answer.text << '"';
}

constexpr char kUntouched[] = "(untouched)";

Answer send(const sp<TouchCompanionClient>& client, const char* command) {
    char untouched[] = "";
    char* result = untouched;
    const int status = client->sendCommand(command, &result);
    if (result == untouched) {
        return {status, kUntouched};
    }
    const std::unique_ptr<char, decltype(&free)> owned(result, &free);
    return {status, result == nullptr ? "(null)" : result};
}

std::string commandRequest(const std::string& parameters) {
    return R"({"DEBUG_COMMAND":{"REQUEST":{"ACTION":"SEND_COMMAND","PARAMETERS":{)" + parameters +
           "}}}}";
}

std::string propertyRequest(const std::string& parameters) {
    return R"({"PROPERTY_COMMAND":{"REQUEST":{"ACTION":"STR_SET_ROLLINGLOG_SIZE","PARAMETERS":{)" +
           parameters + "}}}}";
}

std::string filterRequest(const std::string& mask) {
    return R"({"DEBUG_COMMAND":{"REQUEST":{"ACTION":"SET_RECORD_FILTER","PARAMETERS":{"MASK":)" +
           mask + "}}}}";
}

std::string debugResponse(const std::string& results) {
    return R"({"DEBUG_COMMAND":{"RESPONSE":{"RESULTS":)" + results + "}}}";
}

class TouchCompanionCommands : public TouchCompanionRemoteTest {
  protected:
    // A response without entries would not be readable.
    void SetUp() override {
        TouchCompanionRemoteTest::SetUp();
        respond(R"({"any":1})");
    }

    void respond(const std::string& text) { mService->response = mapOf(text); }
};

// ---- the requests ----

TEST_F(TouchCompanionCommands, CommandWithNumbersIsSentByteForByte) {
    respond(debugResponse(R"({"OUT_STRING":"done","OUT_VALUE":4})"));
    EXPECT_EQ((Answer{0, "done"}), send(mClient, "calibrate 3 0x10"));
    expectSentText(kSendCommandCode,
                   R"({"DEBUG_COMMAND":{"REQUEST":{"ACTION":"SEND_COMMAND","PARAMETERS":)"
                   R"({"NUM_OF_ELEMENTS":2,"SEND_COMMAND_NAME":"calibrate","VALUES":[3,16]}}}})");
    EXPECT_THAT(clientLines(),
                ElementsAre("D sendCommand: char E", "D sendCommand:: req = calibrate 3 0x10\n",
                            "D sendCommand: SUCCESS!! retval =0\n",
                            "D sendCommand: SUCCESS!! used_len =4\n",
                            "D sendCommand: char X retval =0"));
}

TEST_F(TouchCompanionCommands, CommandWithoutASpaceIsSentByteForByte) {
    respond(debugResponse(R"({"OUT_STRING":"done","OUT_VALUE":4})"));
    EXPECT_EQ((Answer{0, "done"}), send(mClient, "status"));
    expectSentText(kSendCommandCode,
                   R"({"DEBUG_COMMAND":{"REQUEST":{"ACTION":"SEND_COMMAND","PARAMETERS":)"
                   R"({"NUM_OF_ELEMENTS":0,"SEND_COMMAND_NAME":"status"}}}})");
}

TEST_F(TouchCompanionCommands, RecordFilterIsSentByteForByte) {
    respond(debugResponse("0"));
    EXPECT_EQ(0, mClient->setRecordFilter(0x1F));
    expectSentText(kSendCommandCode, R"({"DEBUG_COMMAND":{"REQUEST":{"ACTION":"SET_RECORD_FILTER",)"
                                     R"("PARAMETERS":{"MASK":31}}}})");
}

TEST_F(TouchCompanionCommands, PropertyIsSentByteForByte) {
    EXPECT_EQ(0, mClient->setProperty("setRollingLogSize", "1024"));
    expectSentText(kSendCommandCode,
                   R"({"PROPERTY_COMMAND":{"REQUEST":{"ACTION":"STR_SET_ROLLINGLOG_SIZE",)"
                   R"("PARAMETERS":{"NUM_OF_ELEMENTS":1,"SEND_COMMAND_NAME":"setRollingLogSize",)"
                   R"("VALUES":[1024]}}}})");
}

struct RequestRow {
    const char* text;
    const char* parameters;
};

TEST_F(TouchCompanionCommands, CommandIsANameAndTheNumbersBehindItsFirstSpace) {
    const RequestRow rows[] = {
            {"x", R"("NUM_OF_ELEMENTS":0,"SEND_COMMAND_NAME":"x")"},
            {"x ", R"("NUM_OF_ELEMENTS":1,"SEND_COMMAND_NAME":"x","VALUES":[0])"},
            {"x 1  2", R"("NUM_OF_ELEMENTS":3,"SEND_COMMAND_NAME":"x","VALUES":[1,0,2])"},
            {" 5", R"("NUM_OF_ELEMENTS":1,"SEND_COMMAND_NAME":"","VALUES":[5])"},
            {"  5", R"("NUM_OF_ELEMENTS":2,"SEND_COMMAND_NAME":"","VALUES":[0,5])"},
            {" ", R"("NUM_OF_ELEMENTS":1,"SEND_COMMAND_NAME":"","VALUES":[0])"},
            {"", R"("NUM_OF_ELEMENTS":0,"SEND_COMMAND_NAME":"")"},
            {"x 010 0x1f -3 7x",
             R"("NUM_OF_ELEMENTS":4,"SEND_COMMAND_NAME":"x","VALUES":[8,31,-3,7])"},
            {"x 4294967297", R"("NUM_OF_ELEMENTS":1,"SEND_COMMAND_NAME":"x","VALUES":[1])"},
            {"x fast", R"("NUM_OF_ELEMENTS":1,"SEND_COMMAND_NAME":"x","VALUES":[0])"},
            {"x\t1", R"("NUM_OF_ELEMENTS":0,"SEND_COMMAND_NAME":"x	1")"},
            {"x \t1", R"("NUM_OF_ELEMENTS":1,"SEND_COMMAND_NAME":"x","VALUES":[1])"},
    };
    respond(debugResponse(R"({"any":1})"));
    for (const RequestRow& row : rows) {
        SCOPED_TRACE(row.text);
        mRemote->clearTransactions();
        EXPECT_EQ((Answer{0, "response success"}), send(mClient, row.text));
        expectSentText(kSendCommandCode, commandRequest(row.parameters));
    }
}

TEST_F(TouchCompanionCommands, PropertyIsNamedAndItsValueIsAListOfNumbers) {
    const RequestRow rows[] = {
            {"", R"("NUM_OF_ELEMENTS":1,"SEND_COMMAND_NAME":"setRollingLogSize","VALUES":[0])"},
            {"7", R"("NUM_OF_ELEMENTS":1,"SEND_COMMAND_NAME":"setRollingLogSize","VALUES":[7])"},
            {"0x400",
             R"("NUM_OF_ELEMENTS":1,"SEND_COMMAND_NAME":"setRollingLogSize","VALUES":[1024])"},
            {"1 2",
             R"("NUM_OF_ELEMENTS":2,"SEND_COMMAND_NAME":"setRollingLogSize","VALUES":[1,2])"},
            {" 1", R"("NUM_OF_ELEMENTS":1,"SEND_COMMAND_NAME":"setRollingLogSize","VALUES":[1])"},
            {"1 ", R"("NUM_OF_ELEMENTS":2,"SEND_COMMAND_NAME":"setRollingLogSize","VALUES":[1,0])"},
            {"big", R"("NUM_OF_ELEMENTS":1,"SEND_COMMAND_NAME":"setRollingLogSize","VALUES":[0])"},
    };
    for (const RequestRow& row : rows) {
        SCOPED_TRACE(row.text);
        mRemote->clearTransactions();
        EXPECT_EQ(0, mClient->setProperty("setRollingLogSize", row.text));
        expectSentText(kSendCommandCode, propertyRequest(row.parameters));
    }
}

TEST_F(TouchCompanionCommands, RecordFilterMaskIsUnsigned) {
    respond(debugResponse("0"));
    for (const auto& [mask, text] : std::vector<std::pair<unsigned int, std::string>>{
                 {0, "0"}, {1, "1"}, {0x80000000u, "2147483648"}, {0xFFFFFFFFu, "4294967295"}}) {
        SCOPED_TRACE(text);
        mRemote->clearTransactions();
        EXPECT_EQ(0, mClient->setRecordFilter(mask));
        expectSentText(kSendCommandCode, filterRequest(text));
    }
}

// A service in the caller's own process sees the values as they were made.
class RequestKeeper : public FakeTouchCompanionService {
  public:
    int sendCommand(SerializableMap& sent, SerializableMap& answer) override {
        request = sent;
        return FakeTouchCompanionService::sendCommand(sent, answer);
    }

    SerializableMap request;
};

TEST_F(TouchCompanionCommands, RequestsAreMadeOfTypedValues) {
    const sp<RequestKeeper> keeper = new RequestKeeper;
    mServices->add("pemaro.TouchService", keeper);
    const sp<TouchCompanionClient> local = connect();

    send(local, "x 1");
    EXPECT_EQ(VALUE_TYPE_OBJECT, keeper->request.getType("DEBUG_COMMAND"));
    SerializableMap& command =
            keeper->request.editValueFor("DEBUG_COMMAND").getValue<SerializableMap>();
    EXPECT_EQ(VALUE_TYPE_OBJECT, command.getType("REQUEST"));
    SerializableMap& body = command.editValueFor("REQUEST").getValue<SerializableMap>();
    EXPECT_EQ(VALUE_TYPE_STRING, body.getType("ACTION"));
    EXPECT_EQ(VALUE_TYPE_OBJECT, body.getType("PARAMETERS"));
    SerializableMap& parameters = body.editValueFor("PARAMETERS").getValue<SerializableMap>();
    EXPECT_EQ(VALUE_TYPE_STRING, parameters.getType("SEND_COMMAND_NAME"));
    EXPECT_EQ(VALUE_TYPE_INT32, parameters.getType("NUM_OF_ELEMENTS"));
    EXPECT_EQ(VALUE_TYPE_ARRAY, parameters.getType("VALUES"));

    local->setRecordFilter(1);
    SerializableMap filter;
    ASSERT_EQ(0, keeper->request.editValueFor("DEBUG_COMMAND").getValue(filter));
    SerializableMap mask = filter.editValueFor("REQUEST")
                                   .getValue<SerializableMap>()
                                   .editValueFor("PARAMETERS")
                                   .getValue<SerializableMap>();
    EXPECT_EQ(VALUE_TYPE_UINT32, mask.getType("MASK"));
}

// ---- the answer to a command ----

struct ResponseRow {
    const char* what;
    std::string response;
    Answer answer;
    std::string usedLine;
};

TEST_F(TouchCompanionCommands, OutValueSaysWhetherThereIsAText) {
    const ResponseRow rows[] = {
            {"a text", debugResponse(R"({"OUT_VALUE":4,"OUT_STRING":"done"})"), {0, "done"}, "4"},
            {"a text longer than told",
             debugResponse(R"({"OUT_VALUE":1,"OUT_STRING":"a long answer"})"),
             {0, "a long answer"},
             "1"},
            {"a text shorter than told",
             debugResponse(R"({"OUT_VALUE":2000000000,"OUT_STRING":"x"})"),
             {0, "x"},
             "2000000000"},
            {"no length", debugResponse(R"({"OUT_STRING":"x"})"), {0, "response success"}, "0"},
            {"length 0",
             debugResponse(R"({"OUT_VALUE":0,"OUT_STRING":"x"})"),
             {0, "response success"},
             "0"},
            {"a negative length",
             debugResponse(R"({"OUT_VALUE":-1,"OUT_STRING":"x"})"),
             {0, "response success"},
             "-1"},
            {"a length that is no number",
             debugResponse(R"({"OUT_VALUE":"many","OUT_STRING":"x"})"),
             {0, "response success"},
             "0"},
            {"a length that is a map",
             debugResponse(R"({"OUT_VALUE":{"a":1},"OUT_STRING":"x"})"),
             {0, "response success"},
             "0"},
            {"a quoted number",
             debugResponse(R"({"OUT_VALUE":"2","OUT_STRING":"ok"})"),
             {0, "ok"},
             "2"},
            {"no text", debugResponse(R"({"OUT_VALUE":3})"), {0, ""}, "3"},
            {"a text that is a number",
             debugResponse(R"({"OUT_VALUE":2,"OUT_STRING":17})"),
             {0, "17"},
             "2"},
            {"a text that is an array",
             debugResponse(R"({"OUT_VALUE":2,"OUT_STRING":[1]})"),
             {0, ""},
             "2"},
            {"neither", debugResponse(R"({"any":1})"), {0, "response success"}, "0"},
    };
    for (const ResponseRow& row : rows) {
        SCOPED_TRACE(row.what);
        respond(row.response);
        clearLog();
        EXPECT_EQ(row.answer, send(mClient, "status"));
        EXPECT_THAT(clientLines(),
                    ElementsAre("D sendCommand: char E", "D sendCommand:: req = status\n",
                                "D sendCommand: SUCCESS!! retval =0\n",
                                "D sendCommand: SUCCESS!! used_len =" + row.usedLine + "\n",
                                "D sendCommand: char X retval =0"));
    }
}

TEST_F(TouchCompanionCommands, UnreadableResponseIsAFailedOne) {
    const std::string responses[] = {
            R"({"any":1})",
            R"({"DEBUG_COMMAND":7})",
            R"({"DEBUG_COMMAND":[1]})",
            R"({"debug_command":{"RESPONSE":{"RESULTS":{"OUT_VALUE":0}}}})",
            R"({"DEBUG_COMMAND":{"RESULTS":{"OUT_VALUE":0}}})",
            R"({"DEBUG_COMMAND":{"RESPONSE":"x"}})",
            R"({"DEBUG_COMMAND":{"RESPONSE":{"any":1}}})",
            debugResponse("4"),
            debugResponse("[1]"),
    };
    for (const std::string& response : responses) {
        SCOPED_TRACE(response);
        respond(response);
        clearLog();
        EXPECT_EQ((Answer{0x4000000C, "response failed"}), send(mClient, "status"));
        EXPECT_THAT(clientLines(),
                    ElementsAre("D sendCommand: char E", "D sendCommand:: req = status\n",
                                "D sendCommand: char X retval =1073741836"));
    }
}

TEST_F(TouchCompanionCommands, LongAnswerIsNotCut) {
    const std::string text(200000, 'a');
    respond(debugResponse(R"({"OUT_VALUE":3,"OUT_STRING":")" + text + "\"}"));
    EXPECT_EQ((Answer{0, text}), send(mClient, "dump"));
}

TEST_F(TouchCompanionCommands, RefusedCommandLeavesTheResultAlone) {
    mService->setStatus("sendCommand", STATUS_INVALID_COMMAND);
    EXPECT_EQ((Answer{STATUS_INVALID_COMMAND, kUntouched}), send(mClient, "nonsense"));
    EXPECT_THAT(clientLines(),
                ElementsAre("D sendCommand: char E", "D sendCommand:: req = nonsense\n",
                            "D sendCommand: char X retval =1073741829"));
}

TEST_F(TouchCompanionCommands, FailedTransactionLeavesTheResultAlone) {
    mRemote->fail(android::DEAD_OBJECT);
    EXPECT_EQ((Answer{0x40000000, kUntouched}), send(mClient, "status"));
    EXPECT_THAT(clientLines(),
                ElementsAre("D sendCommand: char E", "D sendCommand:: req = status\n",
                            "D sendCommand: char X retval =1073741824"));
}

// The text of a map without entries cannot be read: that is a failure of the call, not of the response.
TEST_F(TouchCompanionCommands, EmptyResponseIsAFailedCall) {
    mService->response = SerializableMap();
    EXPECT_EQ((Answer{0x4000000C, kUntouched}), send(mClient, "status"));
    EXPECT_EQ(0x4000000C, mClient->setRecordFilter(1));
    EXPECT_EQ(0x4000000C, mClient->setProperty("setRollingLogSize", "5"));
}

TEST_F(TouchCompanionCommands, NullCommandIsRefusedWithoutACall) {
    EXPECT_EQ((Answer{0x40000000, kUntouched}), send(mClient, nullptr));
    EXPECT_THAT(clientLines(), ElementsAre("D sendCommand: char E", "D sendCommand: req null"));
    expectNothingSent();
}

// ---- record filter ----

TEST_F(TouchCompanionCommands, RecordFilterOnlyLogsItsResult) {
    for (const auto& [response, logged] : std::vector<std::pair<std::string, std::string>>{
                 {"0", "0"}, {"5", "5"}, {"-1", "-1"}, {"\"7 of 9\"", "7"}, {"2.5", "2"}}) {
        SCOPED_TRACE(response);
        respond(debugResponse(response));
        clearLog();
        EXPECT_EQ(0, mClient->setRecordFilter(1));
        EXPECT_THAT(clientLines(), ElementsAre("D setRecordFilter: E",
                                               "D setRecordFilter: SUCCESS!! " + logged + "\n",
                                               "D setRecordFilter: X retval =0"));
    }
}

TEST_F(TouchCompanionCommands, RecordFilterFailsWithTheStatusOfTheResponse) {
    for (const std::string& response :
         {std::string(R"({"any":1})"), debugResponse(R"({"any":1})"), debugResponse("[0]"),
          debugResponse("\"x\""),
          std::string(R"({"PROPERTY_COMMAND":{"RESPONSE":{"RESULTS":0}}})")}) {
        SCOPED_TRACE(response);
        respond(response);
        clearLog();
        EXPECT_EQ(0x4000000C, mClient->setRecordFilter(1));
        EXPECT_THAT(clientLines(),
                    ElementsAre("D setRecordFilter: E", "D setRecordFilter: X retval =1073741836"));
    }
}

TEST_F(TouchCompanionCommands, RecordFilterPassesTheCallsFailureOn) {
    mService->setStatus("sendCommand", STATUS_UNSUPPORTED);
    respond(debugResponse("0"));
    EXPECT_EQ(STATUS_UNSUPPORTED, mClient->setRecordFilter(1));
    EXPECT_THAT(clientLines(),
                ElementsAre("D setRecordFilter: E", "D setRecordFilter: X retval =1073741838"));

    clearLog();
    mRemote->fail(android::DEAD_OBJECT);
    EXPECT_EQ(0x40000000, mClient->setRecordFilter(1));
    EXPECT_THAT(clientLines(),
                ElementsAre("D setRecordFilter: E", "D setRecordFilter: X retval =1073741824"));
}

// ---- property ----

TEST_F(TouchCompanionCommands, PropertyPassesTheStatusOnAndReadsNoResponse) {
    for (const int status : {0, STATUS_BAD_PARAMETER}) {
        SCOPED_TRACE(status);
        mService->setStatus("sendCommand", status);
        clearLog();
        EXPECT_EQ(status, mClient->setProperty("setRollingLogSize", "5"));
        EXPECT_THAT(clientLines(),
                    ElementsAre("D setProperty: char E",
                                "D setProperty:: name = setRollingLogSize, value =5\n",
                                "D setProperty: char X retval =" + std::to_string(status)));
    }
    clearLog();
    mRemote->fail(android::DEAD_OBJECT);
    EXPECT_EQ(0x40000000, mClient->setProperty("setRollingLogSize", "5"));
    EXPECT_EQ("D setProperty: char X retval =1073741824", clientLines().back());
}

TEST_F(TouchCompanionCommands, UnknownPropertyIsRefusedWithoutACall) {
    for (const std::string name :
         {"SetRollingLogSize", "setRollingLogSiz", "setRollingLogSize2", "setrollinglogsize", ""}) {
        SCOPED_TRACE(name);
        clearLog();
        EXPECT_EQ(0x40000005, mClient->setProperty(name.c_str(), "5"));
        EXPECT_THAT(clientLines(), ElementsAre("D setProperty: char E",
                                               "D setProperty:: name = " + name + ", value =5\n"));
        expectNothingSent();
    }
}

TEST_F(TouchCompanionCommands, PropertyWithoutNameOrValueIsRefusedWithoutACall) {
    const std::pair<const char*, const char*> rows[] = {
            {nullptr, "5"}, {"setRollingLogSize", nullptr}, {nullptr, nullptr}};
    for (const auto& [name, value] : rows) {
        clearLog();
        EXPECT_EQ(0x40000005, mClient->setProperty(name, value));
        EXPECT_THAT(clientLines(),
                    ElementsAre("D setProperty: char E", "D setProperty: name or value null"));
        expectNothingSent();
    }
}

// ---- a request of the caller's own ----

TEST_F(TouchCompanionCommands, OwnRequestIsSentAsItIs) {
    respond(R"({"anything":[1,2]})");
    SerializableMap request = mapOf(R"({"own":{"key":"value"}})");
    SerializableMap response = mapOf(R"({"old":1})");
    EXPECT_EQ(0, mClient->sendCommand(request, response));
    expectSentText(kSendCommandCode, R"({"own":{"key":"value"}})");
    EXPECT_EQ(R"({"own":{"key":"value"}})", request.serialize());
    EXPECT_EQ(R"({"anything":[1,2]})", response.serialize());
    EXPECT_THAT(clientLines(), IsEmpty());
}

TEST_F(TouchCompanionCommands, EmptyRequestIsSentAsItIs) {
    SerializableMap request;
    SerializableMap response;
    EXPECT_EQ(0, mClient->sendCommand(request, response));
    expectSentText(kSendCommandCode, "{}");
}

TEST_F(TouchCompanionCommands, RefusedRequestIsAnError) {
    SerializableMap request;
    SerializableMap response;
    mService->setStatus("sendCommand", STATUS_INVALID_COMMAND);
    EXPECT_EQ(STATUS_INVALID_COMMAND, mClient->sendCommand(request, response));
    EXPECT_THAT(clientLines(), ElementsAre("E sendCommand failed"));

    clearLog();
    mRemote->fail(android::DEAD_OBJECT);
    EXPECT_EQ(0x40000000, mClient->sendCommand(request, response));
    EXPECT_THAT(clientLines(), ElementsAre("E sendCommand failed"));
}

// ---- without a service ----

// What a command needs is looked at before the service, which is missed only when it is called.
TEST(TouchCompanionCommandsUnconnected, EveryCommandMissesTheServiceWhenItIsCalled) {
    const sp<TouchCompanionClient> client = new TouchCompanionClient;
    clearLog();
    EXPECT_EQ((Answer{0x4000000B, kUntouched}), send(client, "status"));
    EXPECT_THAT(linesOf(kClientTag),
                ElementsAre("D sendCommand: char E", "D sendCommand:: req = status\n",
                            "D sendCommand: char X retval =1073741835"));

    clearLog();
    EXPECT_EQ((Answer{0x40000000, kUntouched}), send(client, nullptr));
    EXPECT_THAT(linesOf(kClientTag),
                ElementsAre("D sendCommand: char E", "D sendCommand: req null"));

    clearLog();
    EXPECT_EQ(0x4000000B, client->setRecordFilter(1));
    EXPECT_THAT(linesOf(kClientTag),
                ElementsAre("D setRecordFilter: E", "D setRecordFilter: X retval =1073741835"));

    clearLog();
    EXPECT_EQ(0x4000000B, client->setProperty("setRollingLogSize", "5"));
    EXPECT_THAT(linesOf(kClientTag),
                ElementsAre("D setProperty: char E",
                            "D setProperty:: name = setRollingLogSize, value =5\n",
                            "D setProperty: char X retval =1073741835"));

    clearLog();
    EXPECT_EQ(0x40000005, client->setProperty("other", "5"));
    EXPECT_EQ(0x40000005, client->setProperty("other", nullptr));
    EXPECT_EQ(0x40000005, client->setProperty(nullptr, "5"));
    EXPECT_THAT(linesOf(kClientTag),
                ElementsAre("D setProperty: char E", "D setProperty:: name = other, value =5\n",
                            "D setProperty: char E", "D setProperty: name or value null",
                            "D setProperty: char E", "D setProperty: name or value null"));

    clearLog();
    SerializableMap request;
    SerializableMap response;
    EXPECT_EQ(0x4000000B, client->sendCommand(request, response));
    EXPECT_THAT(linesOf(kClientTag), IsEmpty());
}

// ---- reading a response ----

class ResponseReader : public ::testing::Test {
  protected:
    // Callable without a service: the readers use nothing of the client.
    const sp<TouchCompanionClient> mClient = new TouchCompanionClient;
};

TEST_F(ResponseReader, ReadsANumber) {
    const std::pair<const char*, int> rows[] = {
            {"7", 7}, {"-7", -7}, {"2.9", 2}, {"\"12abc\"", 12}, {"0x10", 0}};
    for (const auto& [text, number] : rows) {
        SCOPED_TRACE(text);
        SerializableMap response =
                mapOf(R"({"k":{"RESPONSE":{"RESULTS":)" + std::string(text) + "}}}");
        int result = 99;
        EXPECT_EQ(0, mClient->getResultFromResponseCmd(response, result, "k"));
        EXPECT_EQ(number, result);
    }
}

TEST_F(ResponseReader, ReadsAMapAndAnArray) {
    SerializableMap response = mapOf(R"({"m":{"RESPONSE":{"RESULTS":{"a":1}}},)"
                                     R"("l":{"RESPONSE":{"RESULTS":[1,2]}}})");
    SerializableMap map = mapOf(R"({"old":1})");
    EXPECT_EQ(0, mClient->getResultFromResponseCmd(response, map, "m"));
    EXPECT_EQ(R"({"a":1})", map.serialize());
    SerializableMapArray array;
    array.add(SerializableValue(9));
    EXPECT_EQ(0, mClient->getResultFromResponseCmd(response, array, "l"));
    EXPECT_EQ("[1,2]", array.serialize());
}

TEST_F(ResponseReader, LeavesTheResultAloneWhenItIsNotThere) {
    const char* responses[] = {
            R"({"any":1})",
            R"({"k":1})",
            R"({"k":[1]})",
            R"({"k":{"any":1}})",
            R"({"k":{"RESPONSE":1}})",
            R"({"k":{"response":{"RESULTS":1}}})",
            R"({"k":{"RESPONSE":{"any":1}}})",
            R"({"k":{"RESPONSE":{"RESULTS":true}}})",
            R"({"K":{"RESPONSE":{"RESULTS":1}}})",
    };
    for (const char* text : responses) {
        SCOPED_TRACE(text);
        SerializableMap response = mapOf(text);
        int number = 99;
        EXPECT_EQ(0x4000000C, mClient->getResultFromResponseCmd(response, number, "k"));
        EXPECT_EQ(99, number);
        SerializableMap map = mapOf(R"({"old":1})");
        EXPECT_EQ(0x4000000C, mClient->getResultFromResponseCmd(response, map, "k"));
        EXPECT_EQ(R"({"old":1})", map.serialize());
        SerializableMapArray array;
        array.add(SerializableValue(9));
        EXPECT_EQ(0x4000000C, mClient->getResultFromResponseCmd(response, array, "k"));
        EXPECT_EQ("[9]", array.serialize());
    }
}

// ---- reading numbers ----

class NumberSplitter : public ResponseReader {
  protected:
    // `text` with one more NUL, as the readers ask for where the text is empty.
    std::string split(const std::string& text) {
        std::string buffer = text + '\0';
        SerializableMapArray values;
        int count = 0;
        EXPECT_EQ(0, mClient->getToolCmdValue(&buffer[0], values, count));
        return values.serialize() + " " + std::to_string(count);
    }

    int hexadecimal(const std::string& text) {
        std::string buffer = text + '\0';
        int value = 99;
        EXPECT_EQ(0, mClient->getToolCmdValue(&buffer[0], value));
        return value;
    }
};

TEST_F(NumberSplitter, SplitsAtEachSpaceButTheFirstCharacter) {
    const std::pair<const char*, const char*> rows[] = {
            {"5", "[5] 1"},
            {" 5", "[5] 1"},
            {"1 2 3", "[1,2,3] 3"},
            {" 1  2", "[1,0,2] 3"},
            {"1 ", "[1,0] 2"},
            {" ", "[0] 1"},
            {"  ", "[0,0] 2"},
            {"", "[0] 1"},
            {" 010 0x1f -3 7x", "[8,31,-3,7] 4"},
            {"0X1F +5 -0x10 -010", "[31,5,-16,-8] 4"},
            {"08 0x 0xg", "[0,0,0] 3"},
            {"x", "[0] 1"},
            {"\t7", "[7] 1"},
            {"1\t2", "[1] 1"},
            {"1.9", "[1] 1"},
            {"2147483647 2147483648 4294967295 4294967297", "[2147483647,-2147483648,-1,1] 4"},
            {"-2147483648 -2147483649", "[-2147483648,2147483647] 2"},
    };
    for (const auto& [text, result] : rows) {
        EXPECT_EQ(result, split(text)) << '"' << text << '"';
    }
}

TEST_F(NumberSplitter, TakesItsFirstCharacterEvenIfThatIsANul) {
    char text[] = "\0 5";
    SerializableMapArray values;
    int count = 0;
    EXPECT_EQ(0, mClient->getToolCmdValue(text, values, count));
    EXPECT_EQ("[0,5]", values.serialize());
    EXPECT_EQ(2, count);
}

TEST_F(NumberSplitter, AddsToWhatIsThere) {
    char text[] = "1 2";
    SerializableMapArray values;
    values.add(SerializableValue(9));
    int count = 40;
    EXPECT_EQ(0, mClient->getToolCmdValue(text, values, count));
    EXPECT_EQ("[9,1,2]", values.serialize());
    EXPECT_EQ(42, count);
}

TEST_F(NumberSplitter, MakesSignedNumbers) {
    char text[] = "1";
    SerializableMapArray values;
    int count = 0;
    mClient->getToolCmdValue(text, values, count);
    SerializableMap map;
    map.add("number", values.get(0));
    EXPECT_EQ(VALUE_TYPE_INT32, map.getType("number"));
}

TEST_F(NumberSplitter, ReadsOneHexadecimalNumber) {
    const std::pair<const char*, int> rows[] = {
            {"1f", 31},
            {"1F", 31},
            {"0x1f", 31},
            {"0X10", 16},
            {" 10", 16},
            {"10 20", 16},
            {"-1", -1},
            {"ffffffff", -1},
            {"7g", 7},
            {"zz", 0},
            {"", 0},
            {"100000001", 1},
            {"80000000", -2147483647 - 1},
    };
    for (const auto& [text, number] : rows) {
        EXPECT_EQ(number, hexadecimal(text)) << '"' << text << '"';
    }
}

TEST_F(NumberSplitter, HexadecimalReaderTakesItsFirstCharacterEvenIfThatIsANul) {
    EXPECT_EQ(0, hexadecimal(std::string("\0", 1) + "7"));
}

// ---- threads ----

// Answers each command with its name.
class EchoingService : public FakeTouchCompanionService {
  public:
    int sendCommand(SerializableMap& request, SerializableMap& answer) override {
        SerializableMap& body = inner(inner(request, "DEBUG_COMMAND"), "REQUEST");
        SerializableMap results;
        results.add("OUT_VALUE", 1);
        results.add("OUT_STRING", inner(body, "PARAMETERS").editValueFor("SEND_COMMAND_NAME"));
        SerializableMap response;
        response.add("RESULTS", results);
        SerializableMap outer;
        outer.add("RESPONSE", response);
        answer.add("DEBUG_COMMAND", outer);
        return 0;
    }

  private:
    static SerializableMap& inner(SerializableMap& map, const char* key) {
        return map.editValueFor(key).getValue<SerializableMap>();
    }
};

TEST_F(TouchCompanionCommands, CommandsOfSeveralThreadsAreIndependent) {
    mRemote->forwardTo(new EchoingService);
    std::vector<std::thread> threads;
    for (int thread = 0; thread < 4; ++thread) {
        threads.emplace_back([this, thread] {
            for (int i = 0; i < 50; ++i) {
                const std::string name = "c" + std::to_string(thread) + "-" + std::to_string(i);
                EXPECT_EQ((Answer{0, name}), send(mClient, (name + " 1 2").c_str()));
            }
        });
    }
    for (std::thread& thread : threads) {
        thread.join();
    }
}

}  // namespace
}  // namespace pemaro::test
