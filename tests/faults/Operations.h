// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <functional>
#include <iosfwd>
#include <string>
#include <vector>

#include "pemaro/GestureManagerClient.h"
#include "pemaro/HandBiometricManagerClient.h"
#include "pemaro/TouchCompanionClient.h"
#include "pemaro/TouchManagerClient.h"
#include "tests/support/LogLines.h"
#include "tests/support/ParcelBytes.h"

namespace pemaro::test {

constexpr const char* kServices[] = {"pemaro.TouchService", "pemaro.TouchManagerService",
                                     "pemaro.GestureManagerService",
                                     "pemaro.HandBiometricManagerService"};

/// A client of each kind. They are disconnected at the end: the driver may keep a client alive for a
/// while, and it would be told of a later death.
struct Clients {
    Clients();
    ~Clients();

    /// How often those that watch their service were told of its death.
    int deaths() const;

    android::sp<TouchCompanionClient> companion;
    android::sp<TouchManagerClient> touch;
    android::sp<GestureManagerClient> gesture;
    android::sp<HandBiometricManagerClient> hand;
};

/// What a call returned, and what it stored as text.
struct Outcome {
    int status;
    std::string stored;

    bool operator==(const Outcome& other) const {
        return status == other.status && stored == other.stored;
    }
};
std::ostream& operator<<(std::ostream& stream, const Outcome& outcome);

/// A reply that ends after `bytes`.
struct ShortReply {
    size_t bytes;
    Outcome outcome;
    /// The proxy's lines at error priority, and whether the client adds those of a failure.
    Lines lines;
};

/// An operation of a client, what its service sends, and what comes of it. Lines are log lines at
/// error priority; a format in them takes the reason.
struct Operation {
    const char* client;
    const char* name;
    /// Index into kServices.
    int service;
    std::function<Outcome(Clients&)> call;

    /// The reply with a status; the same for success, with the status 0.
    std::function<ParcelWriter(int status)> reply;
    /// What is stored before the call, after a success, and after a refusal.
    std::string before;
    std::string after;
    std::string afterRefusal;
    std::vector<ShortReply> shortReplies;

    /// False for the one reply that has no place for a status.
    bool canRefuse = true;
    const char* refusedInProxy = nullptr;
    const char* refusedInClient = nullptr;
    const char* deadInProxy = nullptr;
    const char* deadInClient = nullptr;
    /// The client's text without a service, where it has one.
    const char* absentInClient = nullptr;
    /// What a client that watches its service logs of its death.
    const char* deathNotice = nullptr;
};
std::ostream& operator<<(std::ostream& stream, const Operation& operation);

const std::vector<Operation>& allOperations();

/// A line at error priority, or none for a null text.
Lines errorLines(const char* format, const char* reason);

}  // namespace pemaro::test
