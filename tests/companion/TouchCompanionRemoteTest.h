// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>

#include "tests/companion/CompanionInterface.h"
#include "tests/companion/TouchCompanionClientTest.h"
#include "tests/support/MapText.h"
#include "tests/support/ParcelBytes.h"
#include "tests/support/RecordingBinder.h"

namespace pemaro::test {

/// A connected client whose calls cross a proxy and a stub, as to another process: `mRemote` keeps
/// the transactions.
class TouchCompanionRemoteTest : public TouchCompanionClientTest {
  protected:
    void SetUp() override {
        TouchCompanionClientTest::SetUp();
        mRemote->forwardTo(mService);
        mServices->add(kDescriptor, mRemote);
        mClient = connect();
        mRemote->clearTransactions();
    }

    /// Expects one transaction, with this code and these arguments.
    void expectSent(uint32_t code, const ParcelWriter& arguments = {}) {
        ASSERT_EQ(1u, mRemote->transactions().size());
        EXPECT_EQ(code, mRemote->lastTransaction().code);
        EXPECT_EQ(0u, mRemote->lastTransaction().flags);
        EXPECT_EQ(requestBytes(kDescriptor, arguments), mRemote->lastTransaction().request);
    }

    void expectSentText(uint32_t code, const std::string& text) {
        expectSent(code, [&](android::Parcel& parcel) { writeString8(parcel, text); });
    }

    void expectNothingSent() { EXPECT_EQ(0u, mRemote->transactions().size()); }

    const android::sp<RecordingBinder> mRemote = new RecordingBinder(kDescriptor);
    android::sp<TouchCompanionClient> mClient;
};

}  // namespace pemaro::test
