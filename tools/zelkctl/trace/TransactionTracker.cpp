// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/trace/TransactionTracker.h"

#include <linux/android/binder.h>

#include <algorithm>
#include <utility>

namespace pemaro::zelkctl {
namespace {

/// The code of all callbacks.
constexpr uint32_t kFirstCode = 1;
/// How long a reply's arrival is awaited, and how long it may take to learn an object's interface.
constexpr int64_t kPatience = 2'000'000'000;

}  // namespace

TransactionTracker::TransactionTracker(std::function<void(const TracedCall&)> report)
        : mReport(std::move(report)) {}

void TransactionTracker::recognise(uint64_t bytes, const KnownInterface& callback) {
    mLengths[bytes] = &callback;
}

void TransactionTracker::addLookup(const KnownInterface& service, int thread, int64_t from,
                                   int64_t to) {
    mLookups.push_back({&service, thread, from, to});
}

bool TransactionTracker::takeRegistration() {
    return std::exchange(mRegistration, false);
}

void TransactionTracker::take(const BinderEvent& event) {
    switch (event.kind) {
        case BinderEvent::Kind::kSent:
            event.isReply ? takeReply(event) : takeRequest(event);
            break;
        case BinderEvent::Kind::kReceived:
            takeReceived(event);
            break;
        case BinderEvent::Kind::kBuffer:
            takeBuffer(event);
            break;
        case BinderEvent::Kind::kNode:
            takeNode(event);
            break;
        case BinderEvent::Kind::kReturn:
            takeReturn(event);
            break;
    }
}

// ---- events --------------------------------------------------------------------------------------

void TransactionTracker::takeRequest(const BinderEvent& event) {
    dropStale(event.thread);
    Entry entry;
    entry.object = event.object;
    entry.call.code = event.code;
    entry.call.number = event.number;
    entry.call.sent = event.time;
    entry.call.fromThread = event.thread;
    entry.call.toProcess = event.process;
    entry.call.end = (event.flags & TF_ONE_WAY) != 0 ? CallEnd::kOneWay : CallEnd::kOpen;
    if (lookupOf(entry.call) != nullptr) {
        mManager = event.object;
    }
    const auto known = mObjects.find(event.object);
    entry.call.interface = known == mObjects.end() ? nullptr : known->second;
    if (entry.call.end != CallEnd::kOneWay) {
        mWaiting[event.thread].push_back(event.number);
    }
    mCalls[event.number] = std::move(entry);
}

/// A thread that calls anew waits for nothing, unless it was called in turn.
void TransactionTracker::dropStale(int thread) {
    for (auto waiting = mWaiting.find(thread); waiting != mWaiting.end();
         waiting = mWaiting.find(thread)) {
        const TracedCall& call = mCalls.at(waiting->second.back()).call;
        const auto serving = mServing.find(thread);
        const bool isCalledInTurn = serving != mServing.end() &&
                                    mCalls.at(serving->second.back()).call.received > call.sent;
        if (call.replied == 0 && isCalledInTurn) {
            return;
        }
        end(call.number, call.end);
    }
}

void TransactionTracker::takeReply(const BinderEvent& event) {
    Entry* entry = waitingOn(event);
    if (entry == nullptr) {
        return;
    }
    TracedCall& call = entry->call;
    call.replied = event.time;
    call.fromProcess = event.process;
    call.toThread = event.thread;
    call.end = (event.flags & TF_STATUS_CODE) != 0 ? CallEnd::kRefused : CallEnd::kAnswered;
    entry->reply = event.number;
    mReplies[event.number] = call.number;
    const auto serving = mServing.find(event.thread);
    if (serving != mServing.end()) {
        auto& numbers = serving->second;
        numbers.erase(std::remove(numbers.begin(), numbers.end(), call.number), numbers.end());
        if (numbers.empty()) {
            mServing.erase(serving);
        }
    }
}

/// The innermost call that the reply can belong to.
TransactionTracker::Entry* TransactionTracker::waitingOn(const BinderEvent& reply) {
    const auto waiting = mWaiting.find(reply.toThread);
    if (waiting == mWaiting.end()) {
        return nullptr;
    }
    for (auto number = waiting->second.rbegin(); number != waiting->second.rend(); ++number) {
        Entry& entry = mCalls.at(*number);
        const bool isServedElsewhere =
                entry.call.toThread != 0 && entry.call.toThread != reply.thread;
        if (entry.call.replied == 0 && !isServedElsewhere) {
            return &entry;
        }
    }
    return nullptr;
}

void TransactionTracker::takeReceived(const BinderEvent& event) {
    bool isReply = false;
    Entry* entry = entryOf(event.number, &isReply);
    if (entry == nullptr) {
        return;
    }
    if (isReply) {
        entry->call.returned = event.time;
        end(entry->call.number, entry->call.end);
        return;
    }
    entry->call.received = event.time;
    entry->call.toThread = event.thread;
    if (entry->call.end == CallEnd::kOneWay) {
        end(event.number, CallEnd::kOneWay);
    } else {
        mServing[event.thread].push_back(event.number);
    }
}

void TransactionTracker::takeBuffer(const BinderEvent& event) {
    bool isReply = false;
    Entry* entry = entryOf(event.number, &isReply);
    if (entry == nullptr) {
        return;
    }
    (isReply ? entry->call.replyBytes : entry->call.requestBytes) = event.size;
    const auto length = mLengths.find(event.size);
    if (!isReply && entry->call.interface == nullptr && entry->call.code == kFirstCode &&
        length != mLengths.end()) {
        learn(entry->object, *length->second);
    }
}

void TransactionTracker::takeNode(const BinderEvent& event) {
    bool isReply = false;
    Entry* entry = entryOf(event.number, &isReply);
    if (entry == nullptr) {
        return;
    }
    (isReply ? entry->returned : entry->handed).push_back(event.object);
    if (!isReply) {
        mRegistration = mRegistration || (mManager != 0 && entry->object == mManager);
    } else if (const Lookup* lookup = lookupOf(entry->call)) {
        learn(event.object, *lookup->service);
    }
    learnFrom(*entry);
}

void TransactionTracker::takeReturn(const BinderEvent& event) {
    const auto waiting = mWaiting.find(event.thread);
    if (waiting == mWaiting.end()) {
        return;
    }
    const int number = waiting->second.back();
    mCalls.at(number).call.returned = event.time;
    end(number, event.command == BR_DEAD_REPLY ? CallEnd::kDead : CallEnd::kUndelivered);
}

TransactionTracker::Entry* TransactionTracker::entryOf(int number, bool* isReply) {
    const auto reply = mReplies.find(number);
    *isReply = reply != mReplies.end();
    const auto call = mCalls.find(*isReply ? reply->second : number);
    return call == mCalls.end() ? nullptr : &call->second;
}

/// The lookup of our own that made this call.
const TransactionTracker::Lookup* TransactionTracker::lookupOf(const TracedCall& call) const {
    const auto found =
            std::find_if(mLookups.begin(), mLookups.end(), [&call](const Lookup& lookup) {
                return lookup.thread == call.fromThread && call.sent >= lookup.from &&
                       call.sent <= lookup.to;
            });
    return found == mLookups.end() ? nullptr : &*found;
}

// ---- what the objects are ------------------------------------------------------------------------

void TransactionTracker::learn(int object, const KnownInterface& interface) {
    const KnownInterface*& known = mObjects[object];
    if (known == &interface) {
        return;
    }
    known = &interface;
    for (auto& [number, entry] : mCalls) {
        if (entry.object == object) {
            entry.call.interface = &interface;
            learnFrom(entry);
        }
    }
    std::vector<Entry> decided;
    const auto rest =
            std::stable_partition(mUndecided.begin(), mUndecided.end(),
                                  [object](const Entry& entry) { return entry.object != object; });
    std::move(rest, mUndecided.end(), std::back_inserter(decided));
    mUndecided.erase(rest, mUndecided.end());
    for (Entry& entry : decided) {
        entry.call.interface = &interface;
        mReport(entry.call);
        learnFrom(entry);
    }
}

void TransactionTracker::learnFrom(const Entry& entry) {
    const KnownOperation* operation =
            entry.call.interface == nullptr ? nullptr : entry.call.interface->find(entry.call.code);
    if (operation == nullptr) {
        return;
    }
    // Learning goes through all entries, and learns again: the lists are copied before.
    const auto learnAll = [this](const std::vector<int>& objects, const KnownInterface* interface) {
        if (interface == nullptr) {
            return;
        }
        for (const int object : objects) {
            learn(object, *interface);
        }
    };
    const std::vector<int> handed = entry.handed;
    const std::vector<int> returned = entry.returned;
    learnAll(handed, operation->handed);
    learnAll(returned, operation->returned);
}

// ---- ends ----------------------------------------------------------------------------------------

void TransactionTracker::end(int number, CallEnd how) {
    auto node = mCalls.extract(number);
    Entry& entry = node.mapped();
    entry.call.end = how;
    mReplies.erase(entry.reply);
    for (auto* threads : {&mWaiting, &mServing}) {
        const auto place =
                threads->find(threads == &mWaiting ? entry.call.fromThread : entry.call.toThread);
        if (place != threads->end()) {
            auto& numbers = place->second;
            numbers.erase(std::remove(numbers.begin(), numbers.end(), number), numbers.end());
            if (numbers.empty()) {
                threads->erase(place);
            }
        }
    }
    if (entry.call.interface != nullptr) {
        mReport(entry.call);
    } else {
        mUndecided.push_back(std::move(entry));
    }
}

void TransactionTracker::expire(int64_t now) {
    std::vector<std::pair<int, CallEnd>> ended;
    for (const auto& [number, entry] : mCalls) {
        const TracedCall& call = entry.call;
        const int64_t since = call.end == CallEnd::kOneWay ? call.sent : call.replied;
        if (since != 0 && now - since > kPatience) {
            ended.emplace_back(number, call.end);
        }
    }
    for (const auto& [number, how] : ended) {
        end(number, how);
    }
    const auto isOld = [now](const Entry& entry) { return now - entry.call.sent > kPatience; };
    mUndecided.erase(std::remove_if(mUndecided.begin(), mUndecided.end(), isOld), mUndecided.end());
    mLookups.erase(
            std::remove_if(mLookups.begin(), mLookups.end(),
                           [now](const Lookup& lookup) { return now - lookup.to > kPatience; }),
            mLookups.end());
}

void TransactionTracker::finish() {
    std::vector<std::pair<int, CallEnd>> ended;
    for (const auto& [number, entry] : mCalls) {
        ended.emplace_back(number, entry.call.end);
    }
    std::sort(ended.begin(), ended.end());
    for (const auto& [number, how] : ended) {
        end(number, how);
    }
}

}  // namespace pemaro::zelkctl
