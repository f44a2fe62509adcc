// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstdint>
#include <deque>
#include <functional>
#include <map>
#include <unordered_map>
#include <vector>

#include "tools/zelkctl/services/Interfaces.h"
#include "tools/zelkctl/trace/BinderEvent.h"
#include "tools/zelkctl/trace/TracedCall.h"

namespace pemaro::zelkctl {

/// Finds among the events of all processes the calls of known interfaces, and pairs each with its reply.
///
/// The driver numbers the objects that are called and tells nothing of their interfaces. Whose object
/// has which number is learned:
/// - from the service manager's replies to lookups of our own, which hand the service's object over;
/// - from the calls themselves: what `subscribe` hands over is the callback of that manager's client;
/// - where that was before the first event, from the length of a callback's request.
class TransactionTracker {
  public:
    /// `report` is called for each call that has ended.
    explicit TransactionTracker(std::function<void(const TracedCall&)> report);

    /// A first request with this code and so many bytes means an object of this interface.
    void recognise(uint64_t bytes, const KnownInterface& callback);

    /// This thread asked the service manager for the service between these two moments.
    void addLookup(const KnownInterface& service, int thread, int64_t from, int64_t to);

    /// REQUIRES: the events come in the order of their times.
    void take(const BinderEvent& event);

    /// Whether an object was handed to the service manager since this was asked last: a service may
    /// have come.
    bool takeRegistration();

    /// Lets go of what can wait no longer at this moment.
    void expire(int64_t now);

    /// Events were lost, or there will be no more: what is under way is reported as far as it is known.
    void finish();

  private:
    struct Entry {
        TracedCall call;
        int object = 0;
        int reply = 0;  ///< its number
        std::vector<int> handed;
        std::vector<int> returned;
    };
    struct Lookup {
        const KnownInterface* service;
        int thread;
        int64_t from;
        int64_t to;
    };

    void takeRequest(const BinderEvent& event);
    void takeReply(const BinderEvent& event);
    void takeReceived(const BinderEvent& event);
    void takeBuffer(const BinderEvent& event);
    void takeNode(const BinderEvent& event);
    void takeReturn(const BinderEvent& event);

    Entry* entryOf(int number, bool* isReply);
    Entry* waitingOn(const BinderEvent& reply);
    const Lookup* lookupOf(const TracedCall& call) const;
    void dropStale(int thread);
    void learn(int object, const KnownInterface& interface);
    void learnFrom(const Entry& entry);
    void end(int number, CallEnd how);

    const std::function<void(const TracedCall&)> mReport;
    std::map<uint64_t, const KnownInterface*> mLengths;
    std::vector<Lookup> mLookups;
    std::unordered_map<int, const KnownInterface*> mObjects;
    int mManager = 0;
    bool mRegistration = false;
    /// What is under way, by number, and the numbers of their replies.
    std::unordered_map<int, Entry> mCalls;
    std::unordered_map<int, int> mReplies;
    /// Of each thread, the calls that it waits for, and those that it works for, outermost first.
    std::unordered_map<int, std::vector<int>> mWaiting;
    std::unordered_map<int, std::vector<int>> mServing;
    /// Ended calls of objects that may still turn out to be known.
    std::deque<Entry> mUndecided;
};

}  // namespace pemaro::zelkctl
