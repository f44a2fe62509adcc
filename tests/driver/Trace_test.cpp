// SPDX-License-Identifier: Apache-2.0
// "zelkctl trace" sees the calls that others make, and leaves the kernel's tracing as it was.

#include <android-base/file.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <rapidjson/document.h>
#include <signal.h>
#include <unistd.h>

#include <algorithm>
#include <chrono>
#include <filesystem>
#include <map>
#include <memory>
#include <string>
#include <thread>
#include <vector>

#include "tests/driver/CommandRows.h"
#include "tests/driver/DriverSetting.h"
#include "tests/support/Terminal.h"

using testing::AllOf;
using testing::Contains;
using testing::ElementsAre;
using testing::HasSubstr;
using testing::IsEmpty;
using testing::MatchesRegex;
using testing::StartsWith;

namespace pemaro::test {

namespace {

const std::string kTracing = "/sys/kernel/tracing";

std::string readFile(const std::string& path) {
    std::string text;
    android::base::ReadFileToString(path, &text);
    return text;
}

std::vector<std::string> instances() {
    std::vector<std::string> names;
    for (const auto& entry : std::filesystem::directory_iterator(kTracing + "/instances")) {
        names.push_back(entry.path().filename());
    }
    return names;
}

// A trace in the background. It is under way once this exists.
class RunningTrace {
  public:
    explicit RunningTrace(Words arguments) : mProcess(commandOf(std::move(arguments))) {
        const std::string folder =
                kTracing + "/instances/zelkctl-" + std::to_string(mProcess.pid());
        // The event that is switched on last, and then all of them.
        const auto state = [&folder] {
            return readFile(folder + "/events/binder/binder_return/enable") +
                   readFile(folder + "/tracing_on");
        };
        for (int i = 0; i < 600 && state() != "1\n1\n"; ++i) {
            std::this_thread::sleep_for(std::chrono::milliseconds(100));
        }
        EXPECT_EQ("1\n1\n", state()) << mProcess.errors();
    }

    ChildProcess& process() { return mProcess; }

    // Has it end once it has printed that; what it printed.
    std::string endAfter(const std::string& text) {
        EXPECT_TRUE(mProcess.awaitOutput(text)) << mProcess.output() << mProcess.errors();
        return end();
    }

    std::string end(int signal = SIGINT) {
        mProcess.signal(signal);
        EXPECT_EQ(0, mProcess.wait()) << mProcess.errors();
        return mProcess.output();
    }

  private:
    static Words commandOf(Words arguments) {
        arguments.insert(arguments.begin(), {binary("zelkctl"), "trace"});
        return arguments;
    }

    ChildProcess mProcess;
};

// The objects of some lines.
std::vector<std::unique_ptr<rapidjson::Document>> parse(const std::string& lines) {
    std::vector<std::unique_ptr<rapidjson::Document>> objects;
    for (const std::string& line : splitLines(lines)) {
        objects.push_back(std::make_unique<rapidjson::Document>());
        objects.back()->Parse(line.c_str());
        EXPECT_TRUE(objects.back()->IsObject()) << line;
    }
    return objects;
}

std::vector<std::string> operationsOf(const std::string& lines) {
    std::vector<std::string> names;
    for (const auto& call : parse(lines)) {
        names.push_back((*call)["service"].GetString() + std::string(".") +
                        (*call)["operation"].GetString());
    }
    return names;
}

const char* const kQuiet[] = {"--gesture-rate", "0", "--hand-rate", "0"};

Words quietStack(Words more = {}) {
    more.insert(more.end(), std::begin(kQuiet), std::end(kQuiet));
    return more;
}

}  // namespace

class Trace : public ::testing::Test {
  protected:
    void SetUp() override {
        ASSERT_EQ(0, access(kTracing.c_str(), R_OK | W_OK)) << "tracefs has to be mounted";
        mBefore = state();
    }

    void TearDown() override {
        EXPECT_THAT(instances(), IsEmpty());
        EXPECT_EQ(mBefore, state());
    }

    // What others would notice.
    static std::string state() {
        std::string text;
        for (const char* file :
             {"tracing_on", "trace_clock", "set_event", "current_tracer", "events/binder/enable"}) {
            text += readFile(kTracing + "/" + file);
        }
        return text;
    }

    std::string mBefore;
};

TEST_F(Trace, TellsWhoCallsWhatAndPairsEachCallWithItsReply) {
    TouchStack stack(quietStack({"--fault", "inspect=delay:200ms"}));
    RunningTrace trace({"--json"});
    ChildProcess caller({binary("zelkctl"), "inspect"});
    ASSERT_EQ(0, caller.wait());
    ASSERT_EQ(0, zelkctl({"hand", "profiles"}).status);
    const std::string lines = trace.endAfter("\"getProfileList\"");
    const std::vector<std::string> operations = operationsOf(lines);
    EXPECT_EQ(1, std::count(operations.begin(), operations.end(), "companion.inspect")) << lines;
    EXPECT_EQ(1, std::count(operations.begin(), operations.end(), "hand.getProfileList")) << lines;
    for (const auto& object : parse(lines)) {
        const auto& call = *object;
        EXPECT_STREQ("answered", call["outcome"].GetString());
        EXPECT_STREQ("zelkctl", call["from"]["name"].GetString());
        EXPECT_STREQ("zelk-touchstack", call["to"]["name"].GetString());
        EXPECT_EQ(stack.process().pid(), call["to"]["process"].GetInt());
        EXPECT_GT(call["serving"].GetDouble(), 0);
        EXPECT_GE(call["seconds"].GetDouble(), call["serving"].GetDouble());
        if (call["operation"] != "inspect") {
            continue;
        }
        EXPECT_STREQ("pemaro.TouchService", call["interface"].GetString());
        EXPECT_EQ(23, call["code"].GetInt());
        EXPECT_EQ(caller.pid(), call["from"]["process"].GetInt());
        // Status and value.
        EXPECT_EQ(8, call["reply"].GetInt());
        EXPECT_GE(call["serving"].GetDouble(), 0.2);
        const auto now = std::chrono::system_clock::now().time_since_epoch();
        EXPECT_NEAR(std::chrono::duration<double>(now).count(), call["time"].GetDouble(), 60);
    }
}

TEST_F(Trace, PrintsALineForEachCall) {
    TouchStack stack(quietStack());
    RunningTrace trace({"touch"});
    ASSERT_EQ(0, zelkctl({"inspect"}).status);
    ASSERT_EQ(0, zelkctl({"touch", "enable", "2"}).status);
    const std::vector<std::string> lines = splitLines(trace.endAfter("touch.unsubscribe"));
    ASSERT_GE(lines.size(), 4u);
    for (size_t i = 0; i + 1 < lines.size(); ++i) {
        EXPECT_THAT(lines[i],
                    MatchesRegex("[0-9:]{8}\\.[0-9]{3}  zelkctl [0-9]+ > zelk-touchstack [0-9]+  "
                                 "touch\\.[a-zA-Z]+  [0-9]+ > [0-9]+ bytes  [0-9.]+ ms"));
    }
    EXPECT_THAT(lines, Contains(HasSubstr("  touch.enable  ")));
    EXPECT_THAT(lines.back(),
                MatchesRegex("traced [0-9]+ calls in [0-9.]+ s, 0 failed, 0 events lost"));
}

TEST_F(Trace, TellsHowCallsFailed) {
    TouchStack stack(quietStack({"--fault", "inspect=die"}));
    RunningTrace trace({"--json"});
    // It calls without an interface's token, among others.
    ASSERT_EQ(0, zelkctl({"check", "hand"}).status);
    ASSERT_EQ(1, zelkctl({"inspect"}).status);
    const std::string lines = trace.endAfter("\"inspect\"");
    EXPECT_THAT(splitLines(lines), Contains(AllOf(HasSubstr("\"operation\":\"getMaxUser\""),
                                                  HasSubstr("\"outcome\":\"refused\""))));
    const std::vector<std::string> all = splitLines(lines);
    const auto dead = std::find_if(all.begin(), all.end(), [](const std::string& line) {
        return line.find("\"inspect\"") != std::string::npos;
    });
    EXPECT_THAT(*dead, AllOf(HasSubstr("\"outcome\":\"dead\""), HasSubstr("\"seconds\":")));
}

TEST_F(Trace, KnowsTheEventsOfManagersByTheirSubscriptionOrTheirLength) {
    TouchStack stack({"--gesture-rate", "20", "--hand-rate", "0"});
    ASSERT_EQ(0, zelkctl({"gesture", "detect", "start"}).status);
    for (const bool before : {false, true}) {
        std::unique_ptr<ChildProcess> watch;
        const auto startWatch = [&watch] {
            watch = std::make_unique<ChildProcess>(
                    Words{binary("zelkctl"), "gesture", "watch", "--seconds", "100"});
            EXPECT_TRUE(watch->awaitOutput("\n")) << watch->errors();
        };
        if (before) {
            startWatch();
        }
        RunningTrace trace({"--json", "gesture"});
        if (!before) {
            startWatch();
        }
        const std::string lines = trace.endAfter("gestureCallback");
        watch->signal(SIGINT);
        EXPECT_EQ(0, watch->wait());
        const std::vector<std::string> operations = operationsOf(lines);
        EXPECT_EQ(before ? 0 : 1,
                  std::count(operations.begin(), operations.end(), "gesture.subscribe"));
        for (const auto& call : parse(lines)) {
            if ((*call)["operation"] == "gestureCallback") {
                EXPECT_STREQ("pemaro.GestureManagerClient", (*call)["interface"].GetString());
                EXPECT_STREQ("zelk-touchstack", (*call)["from"]["name"].GetString());
                EXPECT_EQ(watch->pid(), (*call)["to"]["process"].GetInt());
                EXPECT_GT((*call)["request"].GetInt(), 72144);
            }
        }
    }
}

TEST_F(Trace, WritesAFileForAViewer) {
    TouchStack stack(quietStack());
    Files files;
    const std::string path = files.path("trace.json");
    RunningTrace trace({"--json", "--output", path});
    ASSERT_EQ(0, zelkctl({"record", "--frames", "2"}).status);
    const std::string lines = trace.endAfter("\"unregisterClient\"");

    rapidjson::Document file;
    file.Parse(files.read("trace.json").c_str());
    ASSERT_TRUE(file.IsObject() && file["traceEvents"].IsArray()) << files.read("trace.json");
    size_t slices = 0;
    std::map<int, std::pair<double, int>> arrows;
    for (const auto& event : file["traceEvents"].GetArray()) {
        const std::string kind = event["ph"].GetString();
        if (kind == "X") {
            slices += 1;
            EXPECT_GE(event["dur"].GetDouble(), 0);
        } else if (kind == "s") {
            arrows[event["id"].GetInt()] = {event["ts"].GetDouble(), 0};
        } else if (kind == "f") {
            auto& arrow = arrows[event["id"].GetInt()];
            EXPECT_GT(event["ts"].GetDouble(), arrow.first);
            arrow.second += 1;
        }
    }
    const size_t calls = splitLines(lines).size();
    // Each of them on both threads, with an arrow between.
    EXPECT_EQ(2 * calls, slices);
    EXPECT_EQ(calls, arrows.size());
    for (const auto& [number, arrow] : arrows) {
        EXPECT_EQ(1, arrow.second) << number;
    }
    // The control block's objects are known as well, by the call that returned them.
    EXPECT_THAT(operationsOf(lines), Contains("companion.getMemory"));
}

TEST_F(Trace, GivesTheStandardOutputToTheFile) {
    TouchStack stack(quietStack());
    RunningTrace trace({"--output", "-", "--count", "1"});
    ASSERT_EQ(0, zelkctl({"inspect"}).status);
    EXPECT_EQ(0, trace.process().wait());
    rapidjson::Document file;
    file.Parse(trace.process().output().c_str());
    ASSERT_TRUE(file.IsObject()) << trace.process().output();
    EXPECT_THAT(trace.process().errors(), HasSubstr("traced 1 calls in "));
}

TEST_F(Trace, SumsUp) {
    TouchStack stack(quietStack());
    RunningTrace trace({"--summary", "--json", "--seconds", "30", "companion", "--count", "8"});
    for (int i = 0; i < 4; ++i) {
        ASSERT_EQ(0, zelkctl({"inspect"}).status);
    }
    EXPECT_EQ(0, trace.process().wait());
    int64_t calls = 0;
    for (const auto& row : parse(trace.process().output())) {
        calls += (*row)["calls"].GetInt64();
        EXPECT_EQ(0, (*row)["failed"].GetInt64());
        EXPECT_LE((*row)["p50"].GetDouble(), (*row)["max"].GetDouble());
    }
    EXPECT_EQ(8, calls);
}

TEST_F(Trace, FindsAServiceThatComesLater) {
    RunningTrace trace({"--json", "companion", "hand"});
    for (int i = 0; i < 600 && trace.process().errors().empty(); ++i) {
        std::this_thread::sleep_for(std::chrono::milliseconds(100));
    }
    EXPECT_EQ(
            "{\"note\":\"not running yet, and shown as soon as it is: pemaro.TouchService, "
            "pemaro.HandBiometricManagerService\"}\n",
            trace.process().errors());
    for (int i = 0; i < 2; ++i) {
        TouchStack stack(quietStack());
        ASSERT_EQ(0, zelkctl({"inspect"}).status);
        const std::string last = "\"process\":" + std::to_string(stack.process().pid());
        EXPECT_TRUE(trace.process().awaitOutput(last)) << trace.process().output();
    }
    EXPECT_THAT(operationsOf(trace.end()), Contains("companion.inspect").Times(2));
}

TEST_F(Trace, EndsAtOnceAndLeavesNothing) {
    TouchStack stack(quietStack());
    for (const int signal : {SIGINT, SIGTERM, SIGHUP}) {
        RunningTrace trace({});
        const auto begin = std::chrono::steady_clock::now();
        EXPECT_THAT(trace.end(signal), StartsWith("traced 0 calls in "));
        EXPECT_LT(std::chrono::steady_clock::now() - begin, std::chrono::seconds(5));
        EXPECT_THAT(instances(), IsEmpty());
    }
    EXPECT_EQ(0, zelkctl({"trace", "--seconds", "0.2"}).status);
}

TEST_F(Trace, RemovesWhatOneThatWasKilledLeftBehind) {
    TouchStack stack(quietStack());
    {
        RunningTrace trace({});
        trace.process().signal(SIGKILL);
        EXPECT_EQ(128 + SIGKILL, trace.process().wait());
    }
    EXPECT_EQ(1u, instances().size());
    // Another that runs keeps its own.
    RunningTrace other({});
    EXPECT_THAT(instances(), ElementsAre("zelkctl-" + std::to_string(other.process().pid())));
    EXPECT_EQ(0, zelkctl({"trace", "--seconds", "0.1"}).status);
    EXPECT_EQ(1u, instances().size());
    other.end();
}

TEST_F(Trace, TellsWhatIsMissing) {
    TouchStack stack(quietStack());
    // Each in a view of the file system of its own.
    const struct {
        const char* preparation;
        const char* problem;
    } rows[] = {
            {"umount /sys/kernel/tracing",
             "tracefs is not mounted; as root: mount -t tracefs tracefs /sys/kernel/tracing"},
            {"mount -t tmpfs none /sys/kernel/tracing/events/binder",
             "/sys/kernel/tracing/events/binder lacks binder_transaction, "
             "binder_transaction_received, binder_transaction_alloc_buf, "
             "binder_transaction_node_to_ref, binder_transaction_ref_to_ref, binder_return: this "
             "kernel's Binder driver is not told by these events"},
            {"mount -t tmpfs none /sys/kernel/tracing/events",
             "/sys/kernel/tracing/events/binder is not there: the Binder driver of this kernel has "
             "no trace events, or was built without CONFIG_EVENT_TRACING"},
            {"mount -t tmpfs none /tmp; echo nodev sysfs >/tmp/kinds; "
             "mount --bind /tmp/kinds /proc/filesystems",
             "this kernel has no tracefs: it was built without CONFIG_FTRACE and "
             "CONFIG_EVENT_TRACING"},
            // Root without its right to pass over permissions meets those of everybody.
            {"chown 65534 /sys/kernel/tracing/instances; trap 'chown 0 "
             "/sys/kernel/tracing/instances' "
             "EXIT; set -- setpriv --bounding-set -dac_override,-dac_read_search",
             "/sys/kernel/tracing/instances: Permission denied; tracing takes root's rights"},
    };
    for (const auto& row : rows) {
        const RunResult result = run({"unshare", "--mount", "bash", "-c",
                                      std::string(row.preparation) + "; \"$@\" " +
                                              binary("zelkctl") + " trace --seconds 1"});
        EXPECT_EQ(3, result.status) << row.preparation;
        EXPECT_EQ("zelkctl: " + std::string(row.problem) + "\n", result.errors) << row.preparation;
        EXPECT_EQ("", result.output);
    }
}

TEST_F(Trace, ShowsATableInATerminal) {
    TouchStack stack(quietStack());
    Terminal terminal("env TERM=vt100 " + binary("zelkctl") + " trace", 120, 20);
    ASSERT_TRUE(terminal.awaitText("traced 0 calls in ")) << terminal.text();
    ASSERT_EQ(0, zelkctl({"inspect"}).status);
    ASSERT_TRUE(terminal.awaitText("  companion.inspect")) << terminal.text();
    const std::vector<std::string> lines = splitLines(terminal.text());
    EXPECT_THAT(lines[1],
                MatchesRegex(" +calls +failed +p50 +p99 +max +sent +received +operation *"));
    EXPECT_THAT(lines, Contains(MatchesRegex(" +1 +0( +[0-9.]+ ms){3} +[0-9]+ +8  "
                                             "companion.inspect *")));
    // What does not fit is left out.
    terminal.resize(40, 2);
    EXPECT_TRUE(terminal.await([](const std::string& text) {
        const std::vector<std::string> small = splitLines(text);
        return small.size() == 2 && small[0].find("traced ") == 0 &&
               small[1].find("   calls  failed") == 0;
    })) << terminal.text();
    terminal.resize(120, 20);
    terminal.interrupt();
    ASSERT_TRUE(terminal.awaitText("ended with 0")) << terminal.text();
    // The table stays.
    EXPECT_THAT(terminal.text(), AllOf(HasSubstr("  companion.inspect\n"),
                                       HasSubstr(" failed, 0 events lost\nended with 0")));
}

}  // namespace pemaro::test
