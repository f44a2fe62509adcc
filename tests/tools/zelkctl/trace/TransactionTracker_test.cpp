// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/trace/TransactionTracker.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "tests/tools/zelkctl/trace/RecordedTrace.h"
#include "tools/zelkctl/trace/CallText.h"

using testing::ElementsAre;

namespace pemaro::zelkctl {

namespace {

constexpr int kOurThread = 200;
constexpr uint64_t kTouchCallbackBytes = 72212;

// Our own lookup of the touch manager, whose object turns out to be number 6, at 1 s.
const char* const kLookup =
        "zelkctl-200 [000] 1.000100: binder_transaction: transaction=1 dest_node=1 dest_proc=135 "
        "dest_thread=0 reply=0 flags=0x10 code=0x2\n"
        "servicemanager-135 [000] 1.000200: binder_transaction_received: transaction=1\n"
        "servicemanager-135 [000] 1.000300: binder_transaction: transaction=2 dest_node=0 "
        "dest_proc=199 dest_thread=200 reply=1 flags=0x0 code=0x0\n"
        "servicemanager-135 [000] 1.000310: binder_transaction_ref_to_ref: transaction=2 node=6 "
        "src_ref=7 src_desc=1 ==> dest_ref=46 dest_desc=1\n"
        "zelkctl-200 [000] 1.000400: binder_transaction_received: transaction=2\n";

// "touch.isSupported" and its reply.
const char* const kCall =
        "client-147 [001] 1.100000: binder_transaction: transaction=53 dest_node=6 dest_proc=137 "
        "dest_thread=0 reply=0 flags=0x10 code=0x3\n"
        "client-147 [001] 1.100010: binder_transaction_alloc_buf: transaction=53 data_size=56 "
        "offsets_size=0 extra_buffers_size=0\n"
        "stack-143 [000] 1.100100: binder_transaction_received: transaction=53\n"
        "stack-143 [000] 1.100300: binder_transaction: transaction=54 dest_node=0 dest_proc=146 "
        "dest_thread=147 reply=1 flags=0x0 code=0x0\n"
        "stack-143 [000] 1.100310: binder_transaction_alloc_buf: transaction=54 data_size=8 "
        "offsets_size=0 extra_buffers_size=0\n"
        "client-147 [001] 1.100500: binder_transaction_received: transaction=54\n";

// "touch.subscribe", which hands over the object 50, and is not answered yet.
const char* const kSubscribe =
        "client-147 [001] 1.200000: binder_transaction: transaction=60 dest_node=6 dest_proc=137 "
        "dest_thread=0 reply=0 flags=0x10 code=0x1\n"
        "client-147 [001] 1.200010: binder_transaction_alloc_buf: transaction=60 data_size=84 "
        "offsets_size=8 extra_buffers_size=0\n"
        "client-147 [001] 1.200020: binder_transaction_node_to_ref: transaction=60 node=50 "
        "src_ptr=0x00007f1bf8001c20 ==> dest_ref=51 dest_desc=1\n"
        "stack-143 [000] 1.200100: binder_transaction_received: transaction=60\n";

// Meanwhile that object is called, and the very thread that waits answers.
const char* const kNestedCallback =
        "stack-143 [000] 1.200200: binder_transaction: transaction=61 dest_node=50 dest_proc=146 "
        "dest_thread=147 reply=0 flags=0x10 code=0x1\n"
        "stack-143 [000] 1.200210: binder_transaction_alloc_buf: transaction=61 data_size=72212 "
        "offsets_size=0 extra_buffers_size=0\n"
        "client-147 [001] 1.200300: binder_transaction_received: transaction=61\n"
        "client-147 [001] 1.200400: binder_transaction: transaction=62 dest_node=0 dest_proc=137 "
        "dest_thread=143 reply=1 flags=0x0 code=0x0\n"
        "stack-143 [000] 1.200500: binder_transaction_received: transaction=62\n"
        "stack-143 [000] 1.200600: binder_transaction: transaction=63 dest_node=0 dest_proc=146 "
        "dest_thread=147 reply=1 flags=0x0 code=0x0\n"
        "client-147 [001] 1.200700: binder_transaction_received: transaction=63\n";

class TransactionTrackerTest : public ::testing::Test {
  protected:
    void lookUp() {
        mTracker.addLookup(knownService("touch"), kOurThread, 1'000'000'000, 1'000'500'000);
    }

    void feed(const std::string& lines) {
        for (const BinderEvent& event : readEventLines(lines)) {
            mTracker.take(event);
        }
    }

    // Of each call that was reported: what, how it ended, and what it took in microseconds.
    std::vector<std::string> told() const {
        std::vector<std::string> lines;
        for (const TracedCall& call : mCalls) {
            lines.push_back(callName(call) + " " + callEndWord(call.end) +
                            (call.isTimed() ? " " + std::to_string(call.took() / 1000) : ""));
        }
        return lines;
    }

    std::vector<TracedCall> mCalls;
    TransactionTracker mTracker{[this](const TracedCall& call) { mCalls.push_back(call); }};
};

}  // namespace

TEST_F(TransactionTrackerTest, PairsACallWithItsReply) {
    lookUp();
    feed(kLookup);
    feed(kCall);
    ASSERT_THAT(told(), ElementsAre("touch.isSupported answered 500"));
    const TracedCall& call = mCalls[0];
    EXPECT_EQ(3u, call.code);
    EXPECT_EQ(53, call.number);
    EXPECT_EQ(146, call.fromProcess);
    EXPECT_EQ(147, call.fromThread);
    EXPECT_EQ(137, call.toProcess);
    EXPECT_EQ(143, call.toThread);
    EXPECT_EQ(56u, call.requestBytes);
    EXPECT_EQ(8u, call.replyBytes);
    EXPECT_EQ(1'100'000'000, call.sent);
    EXPECT_EQ(1'100'100'000, call.received);
    EXPECT_EQ(1'100'300'000, call.replied);
    EXPECT_EQ(1'100'500'000, call.returned);
    EXPECT_FALSE(call.failed());
}

TEST_F(TransactionTrackerTest, LearnsOfTheServiceAfterTheCall) {
    lookUp();
    feed(kCall);
    EXPECT_THAT(told(), ElementsAre());
    feed(kLookup);
    EXPECT_THAT(told(), ElementsAre("touch.isSupported answered 500"));
}

TEST_F(TransactionTrackerTest, LeavesOutWhatIsNotAsCalledAtTheTimeOfALookup) {
    mTracker.addLookup(knownService("touch"), kOurThread, 1'000'200'000, 1'000'500'000);
    mTracker.addLookup(knownService("touch"), kOurThread + 1, 0, 2'000'000'000);
    feed(kLookup);
    feed(kCall);
    mTracker.finish();
    EXPECT_THAT(told(), ElementsAre());
}

TEST_F(TransactionTrackerTest, KnowsACallbackByItsSubscriptionAndPairsNestedCalls) {
    lookUp();
    feed(kLookup);
    feed(kSubscribe);
    feed(kNestedCallback);
    EXPECT_THAT(told(),
                ElementsAre("touch.gestureCallback answered 300", "touch.subscribe answered 700"));
    EXPECT_EQ("pemaro.TouchManagerClient", std::string(mCalls[0].interface->descriptor));
}

TEST_F(TransactionTrackerTest, KnowsACallbackByTheLengthOfItsRequest) {
    feed(kSubscribe);
    feed(kNestedCallback);
    EXPECT_THAT(told(), ElementsAre());
    mTracker.recognise(kTouchCallbackBytes, *knownCallbacks()[0]);
    // The numbers of another subscriber.
    feed("stack-143 [000] 1.300000: binder_transaction: transaction=71 dest_node=90 dest_proc=150 "
         "dest_thread=0 reply=0 flags=0x10 code=0x1\n"
         "stack-143 [000] 1.300010: binder_transaction_alloc_buf: transaction=71 data_size=72212 "
         "offsets_size=0 extra_buffers_size=0\n"
         "stack-143 [000] 1.300020: binder_transaction: transaction=72 dest_node=91 dest_proc=151 "
         "dest_thread=0 reply=0 flags=0x10 code=0x2\n"
         "stack-143 [000] 1.300030: binder_transaction_alloc_buf: transaction=72 data_size=72212 "
         "offsets_size=0 extra_buffers_size=0\n");
    mTracker.finish();
    EXPECT_THAT(told(), ElementsAre("touch.gestureCallback open"));
}

TEST_F(TransactionTrackerTest, TellsHowACallFailed) {
    const struct {
        const char* lines;
        const char* told;
        bool failed;
    } rows[] = {
            {"stack-143 [000] 1.100300: binder_transaction: transaction=54 dest_node=0 "
             "dest_proc=146 dest_thread=147 reply=1 flags=0x8 code=0x0\n"
             "client-147 [001] 1.100400: binder_transaction_received: transaction=54\n",
             "touch.isSupported refused 400", true},
            {"client-147 [000] 1.100400: binder_return: cmd=0x7205 BR_DEAD_REPLY\n",
             "touch.isSupported dead 400", true},
            {"client-147 [000] 1.100400: binder_return: cmd=0x7211 BR_FAILED_REPLY\n",
             "touch.isSupported undelivered 400", true},
            // The reply did not fit where it was to go.
            {"stack-143 [000] 1.100300: binder_transaction: transaction=54 dest_node=0 "
             "dest_proc=146 dest_thread=147 reply=1 flags=0x0 code=0x0\n"
             "client-147 [000] 1.100400: binder_return: cmd=0x7211 BR_FAILED_REPLY\n",
             "touch.isSupported undelivered 400", true},
            // Another thread's failure.
            {"client-148 [000] 1.100400: binder_return: cmd=0x7205 BR_DEAD_REPLY\n",
             "touch.isSupported open", false},
            {"", "touch.isSupported open", false},
    };
    for (const auto& row : rows) {
        mCalls.clear();
        TransactionTracker tracker([this](const TracedCall& call) { mCalls.push_back(call); });
        tracker.addLookup(knownService("touch"), kOurThread, 1'000'000'000, 1'000'500'000);
        const std::string request = std::string(kCall).substr(0, std::string(kCall).find("stack"));
        for (const BinderEvent& event : readEventLines(kLookup + request + row.lines)) {
            tracker.take(event);
        }
        tracker.finish();
        EXPECT_THAT(told(), ElementsAre(row.told));
        EXPECT_EQ(row.failed, !mCalls.empty() && mCalls[0].failed()) << row.told;
    }
}

TEST_F(TransactionTrackerTest, AwaitsNoReplyToWhatGoesOneWay) {
    lookUp();
    feed(kLookup);
    feed("client-147 [001] 1.100000: binder_transaction: transaction=53 dest_node=6 dest_proc=137 "
         "dest_thread=0 reply=0 flags=0x11 code=0x5f504e47\n"
         "stack-143 [000] 1.100100: binder_transaction_received: transaction=53\n");
    EXPECT_THAT(told(), ElementsAre("touch.ping one-way"));
}

TEST_F(TransactionTrackerTest, GoesOnAfterARepliesEventIsLost) {
    lookUp();
    feed(kLookup);
    const std::string call = kCall;
    feed(call.substr(0, call.find("stack-143 [000] 1.100300")));
    // The thread calls anew: the call before has ended somehow.
    std::string next = call;
    for (const auto& [number, other] : {std::pair("=53", "=55"), std::pair("=54", "=56")}) {
        for (size_t at = next.find(number); at != std::string::npos; at = next.find(number)) {
            next.replace(at, 3, other);
        }
    }
    feed(next);
    EXPECT_THAT(told(), ElementsAre("touch.isSupported open", "touch.isSupported answered 500"));
}

TEST_F(TransactionTrackerTest, ReportsAReplyThatIsNeverFetched) {
    lookUp();
    feed(kLookup);
    const std::string call = kCall;
    feed(call.substr(0, call.rfind("client-147")));
    mTracker.expire(2'000'000'000);
    EXPECT_THAT(told(), ElementsAre());
    mTracker.expire(4'000'000'000);
    EXPECT_THAT(told(), ElementsAre("touch.isSupported answered 300"));
}

TEST_F(TransactionTrackerTest, ForgetsCallsOfObjectsThatStayUnknown) {
    lookUp();
    feed(kCall);
    mTracker.expire(5'000'000'000);
    feed(kLookup);
    EXPECT_THAT(told(), ElementsAre());
}

namespace {
// A service hands itself to the service manager.
const char* const kRegistration =
        "stack-143 [000] 1.300000: binder_transaction: transaction=80 dest_node=1 "
        "dest_proc=135 dest_thread=0 reply=0 flags=0x10 code=0x3\n"
        "stack-143 [000] 1.300010: binder_transaction_node_to_ref: transaction=80 node=99 "
        "src_ptr=0x00007f1bf8001c20 ==> dest_ref=100 dest_desc=9\n";
}  // namespace

TEST_F(TransactionTrackerTest, NoticesWhatIsHandedToTheServiceManager) {
    feed(kRegistration);
    EXPECT_FALSE(mTracker.takeRegistration());
    lookUp();
    feed(kLookup);
    EXPECT_FALSE(mTracker.takeRegistration());
    feed(kRegistration);
    EXPECT_TRUE(mTracker.takeRegistration());
    EXPECT_FALSE(mTracker.takeRegistration());
}

TEST_F(TransactionTrackerTest, NoticesTheFirstServiceThatComes) {
    lookUp();
    const std::string lookup = kLookup;
    // Nothing is handed back.
    feed(lookup.substr(0, lookup.find("servicemanager-135 [000] 1.000310")) +
         lookup.substr(lookup.find("zelkctl-200 [000] 1.000400")));
    EXPECT_FALSE(mTracker.takeRegistration());
    feed(kRegistration);
    EXPECT_TRUE(mTracker.takeRegistration());
}

}  // namespace pemaro::zelkctl
