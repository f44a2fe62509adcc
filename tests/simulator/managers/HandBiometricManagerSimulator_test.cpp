// SPDX-License-Identifier: Apache-2.0
// The simulated hand biometric manager, seen through the library's client.

#include "simulator/managers/HandBiometricManagerSimulator.h"

#include <gmock/gmock.h>

#include <memory>
#include <string>

#include "pemaro/HandBiometricManagerClient.h"
#include "tests/simulator/managers/ManagerSimulatorTest.h"

using testing::ElementsAre;
using testing::IsEmpty;

namespace pemaro::simulator {

namespace {

using test::RecordCollector;
using Names = std::vector<std::string>;

// An event in short: "enrolling 20", "matched Anna".
std::string describe(const HandRecord& record) {
    switch (record.event) {
        case HandEvent::kEnrollmentStarted:
            return "enrollment started";
        case HandEvent::kEnrollmentProgress:
            return "enrolling " + std::to_string(record.progress);
        case HandEvent::kEnrollmentDone:
            return std::string("enrolled ") + record.profile;
        case HandEvent::kEnrollmentStopped:
            return "enrollment stopped";
        case HandEvent::kScanStarted:
            return "scan started";
        case HandEvent::kScanDone:
            return "scanned";
        case HandEvent::kMatchingStarted:
            return "matching started";
        case HandEvent::kHandDetected:
            return "hand";
        case HandEvent::kMatched:
            return std::string("matched ") + record.profile;
        case HandEvent::kNotMatched:
            return "not matched";
        case HandEvent::kMatchingStopped:
            return "matching stopped";
        case HandEvent::kCancelled:
            return "cancelled";
        case HandEvent::kWakeup:
            return "wake-up";
    }
    return "?";
}

struct HandSimulatorTest
        : ManagerSimulatorTest<HandBiometricManagerSimulator, HandBiometricManagerClient> {
    using Event = IHandBiometricManagerClient::HandBioData;

    HandSimulatorTest()
            : ManagerSimulatorTest(ServiceKind::kHand, new HandBiometricManagerClient(
                                                               RecordCollector::onEvent<Event>,
                                                               RecordCollector::onDeath, &events)) {
    }

    // The events since the last call.
    Names story() {
        const auto published = static_cast<size_t>(service->counts().published);
        EXPECT_TRUE(events.await(published));
        Names result;
        for (const std::string& bytes : events.records()) {
            const auto record = readHandRecord(bytes.data());
            EXPECT_NE(nullptr, record);
            result.push_back(describe(*record));
        }
        result.erase(result.begin(), result.begin() + static_cast<ptrdiff_t>(mTold));
        mTold += result.size();
        return result;
    }

    void enroll(const char* name) {
        EXPECT_EQ(0, client->startEnrollment());
        tick(7);
        EXPECT_EQ(0, client->setProfileName(name));
        story();
    }

    Names profiles() {
        Names names;
        EXPECT_EQ(0, client->getProfileList(names));
        return names;
    }

    // What becomes of one hand after another.
    Names match(int hands) {
        EXPECT_EQ(0, client->startMatching());
        tick(1 + 2 * hands);
        EXPECT_EQ(0, client->stopMatching());
        Names result = story();
        EXPECT_EQ("matching started", result.front());
        EXPECT_EQ("matching stopped", result.back());
        Names judged;
        for (size_t i = 2; i + 1 < result.size(); i += 2) {
            EXPECT_EQ("hand", result[i - 1]);
            judged.push_back(result[i]);
        }
        return judged;
    }

  private:
    size_t mTold = 0;
};

}  // namespace

TEST_F(HandSimulatorTest, EnrollsInOrder) {
    EXPECT_EQ(0, client->startEnrollment());
    EXPECT_THAT(profiles(), IsEmpty());
    tick(9);
    EXPECT_THAT(story(),
                ElementsAre("enrollment started", "enrolling 20", "enrolling 40", "enrolling 60",
                            "enrolling 80", "enrolling 100", "enrolled hand 1"));
    EXPECT_THAT(profiles(), ElementsAre("hand 1"));
}

TEST_F(HandSimulatorTest, AStoppedEnrollmentLeavesNoProfile) {
    EXPECT_EQ(0, client->startEnrollment());
    tick(3);
    EXPECT_EQ(0, client->stopEnrollment());
    tick(9);
    EXPECT_THAT(story(), ElementsAre("enrollment started", "enrolling 20", "enrolling 40",
                                     "enrollment stopped"));
    EXPECT_THAT(profiles(), IsEmpty());
    EXPECT_EQ(0x4000000B, client->setProfileName("Anna"));
}

TEST_F(HandSimulatorTest, NamesTheProfileEnrolledLast) {
    enroll("Anna");
    enroll("Bert");
    EXPECT_EQ(0, client->setProfileName("Berta"));
    EXPECT_THAT(profiles(), ElementsAre("Anna", "Berta"));
    EXPECT_EQ(0, client->renameProfile("Berta", "Carl"));
    EXPECT_EQ(0, client->setProfileName("Dora"));
    EXPECT_THAT(profiles(), ElementsAre("Anna", "Dora"));
    EXPECT_EQ(0, client->deleteProfile("Dora"));
    EXPECT_EQ(0x4000000B, client->setProfileName("Emil"));
}

TEST_F(HandSimulatorTest, KeepsNamesApart) {
    enroll("Anna");
    enroll("Bert");
    EXPECT_EQ(0x40000018, client->renameProfile("Bert", "Anna"));
    EXPECT_EQ(0, client->renameProfile("Bert", "Bert"));
    EXPECT_EQ(0x40000019, client->renameProfile("Carl", "Dora"));
    EXPECT_EQ(0x40000019, client->deleteProfile("Carl"));
    EXPECT_EQ(0x4000000D, client->setProfileName(""));
    EXPECT_EQ(0, client->setProfileName(std::string(47, 'x').c_str()));
    EXPECT_EQ(0x4000000D, client->setProfileName(std::string(48, 'x').c_str()));
    EXPECT_EQ(0x4000001B, service->setProfileName(nullptr));
    EXPECT_EQ(0x4000001B, service->deleteProfile(nullptr));
    EXPECT_EQ(0x4000001B, service->renameProfile(nullptr, "Anna"));
    EXPECT_EQ(0x4000001B, service->renameProfile("Anna", nullptr));
}

TEST_F(HandSimulatorTest, TheNameOfANewHandIsFree) {
    enroll("hand 2");
    client->startEnrollment();
    tick(7);
    EXPECT_THAT(profiles(), ElementsAre("hand 2", "hand 3"));
}

TEST_F(HandSimulatorTest, EnrollsNoMoreThanItsLimit) {
    unsigned int most = 0;
    EXPECT_EQ(0, client->getMaxUser(most));
    EXPECT_EQ(2u, most);
    enroll("Anna");
    enroll("Bert");
    EXPECT_EQ(0x4000000A, client->startEnrollment());
    EXPECT_EQ(0, client->deleteProfile("Anna"));
    EXPECT_EQ(0, client->startEnrollment());
}

TEST_F(HandSimulatorTest, Scans) {
    EXPECT_EQ(0, client->scan());
    EXPECT_EQ(0x4000000B, client->scan());
    tick(4);
    EXPECT_THAT(story(), ElementsAre("scan started", "scanned"));
    EXPECT_EQ(0x4000000B, client->cancelScan());
    EXPECT_EQ(0, client->scan());
    EXPECT_EQ(0, client->cancelScan());
    tick(4);
    EXPECT_THAT(story(), ElementsAre("cancelled"));
}

TEST_F(HandSimulatorTest, MatchesTheRightHandAndNoStranger) {
    enroll("Anna");
    enroll("Bert");
    EXPECT_THAT(match(6), ElementsAre("matched Anna", "matched Anna", "matched Bert",
                                      "matched Bert", "not matched", "matched Anna"));
}

TEST_F(HandSimulatorTest, MatchesNobodyWithoutProfiles) {
    EXPECT_THAT(match(2), ElementsAre("not matched", "not matched"));
}

TEST_F(HandSimulatorTest, HonoursTheSecurityLevel) {
    enroll("Anna");
    const struct {
        int level;
        const char* careless;
    } kRows[] = {
            {0, "matched Anna"},
            {1, "matched Anna"},
            {2, "not matched"},
            {3, "not matched"},
    };
    for (const auto& row : kRows) {
        SCOPED_TRACE(row.level);
        EXPECT_EQ(0, client->setSecurity(row.level));
        EXPECT_THAT(match(3), ElementsAre("matched Anna", row.careless, "not matched"));
    }
    EXPECT_EQ(0x4000000D, client->setSecurity(4));
    EXPECT_EQ(0x4000000D, client->setSecurity(-1));
}

TEST_F(HandSimulatorTest, TellsTheLevelAndTheScore) {
    enroll("Anna");
    client->setSecurity(3);
    match(1);
    const auto judged = readHandRecord(events.records()[events.count() - 2].data());
    ASSERT_EQ(HandEvent::kMatched, judged->event);
    EXPECT_EQ(3, judged->security);
    EXPECT_LE(95u, judged->score);
    EXPECT_GE(100u, judged->score);
}

TEST_F(HandSimulatorTest, DoesOneThingAtATime) {
    enroll("Anna");
    EXPECT_EQ(0x4000000B, client->stopMatching());
    EXPECT_EQ(0x4000000B, client->stopEnrollment());
    EXPECT_EQ(0, client->startMatching());
    EXPECT_EQ(0x4000000B, client->startEnrollment());
    EXPECT_EQ(0x4000000B, client->scan());
    EXPECT_EQ(0x4000000B, client->stopEnrollment());
    EXPECT_EQ(0, client->cancelScan());
    EXPECT_EQ(0x4000000B, client->stopMatching());
}

TEST_F(HandSimulatorTest, AProfileDeletedWhileMatchingIsMatchedNoMore) {
    enroll("Anna");
    client->startMatching();
    tick(2);
    EXPECT_EQ(0, client->deleteProfile("Anna"));
    tick(3);
    EXPECT_THAT(story(),
                ElementsAre("matching started", "hand", "not matched", "hand", "not matched"));
}

TEST_F(HandSimulatorTest, WakesTheDeviceWhileIdle) {
    EXPECT_EQ(0, client->enableWakeup());
    tick(20);
    EXPECT_THAT(story(), ElementsAre("wake-up", "wake-up"));
    EXPECT_EQ(0, client->disableWakeup());
    tick(20);
    EXPECT_THAT(story(), IsEmpty());
}

TEST_F(HandSimulatorTest, FaultsTakeTheOperationsPlace) {
    order("hand.getProfileList=status:0x4000000F");
    Names names = {"kept"};
    EXPECT_EQ(0x4000000F, client->getProfileList(names));
    EXPECT_THAT(names, ElementsAre("kept"));
    order("hand.scan=status:0x40000015");
    EXPECT_EQ(0x40000015, client->scan());
    tick(3);
    EXPECT_THAT(story(), IsEmpty());
}

}  // namespace pemaro::simulator
