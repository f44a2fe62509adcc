// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstdint>
#include <functional>
#include <mutex>
#include <string>
#include <vector>

#include "pemaro/Binder.h"
#include "pemaro/testkit/Watchable.h"
#include "tests/support/ParcelBytes.h"

namespace pemaro::test {

/// A binder that stands for one in another process: a proxy is made around it because it answers no
/// query for a local interface.
/// It keeps every transaction and answers as it was told, and it can die: then those who are linked
/// are told, and everything is answered with DEAD_OBJECT.
///
///     sp<RecordingBinder> remote = new RecordingBinder;
///     remote->answer([](Parcel& reply) { reply.writeInt32(0); });
///     interface_cast<ITouchCompanionService>(remote)->open();
///     EXPECT_EQ(3u, remote->transactions()[0].code);
///
/// Callable from any thread.
class RecordingBinder : public Watchable<android::BBinder> {
  public:
    struct Transaction {
        uint32_t code;
        uint32_t flags;
        Bytes request;
    };

    using Handler = std::function<android::status_t(uint32_t code, const android::Parcel& data,
                                                    android::Parcel* reply)>;

    /// Answers every transaction with status 0 and an empty reply until told otherwise.
    RecordingBinder();
    explicit RecordingBinder(const std::string& descriptor);

    /// Answers every further transaction with `status`, and with a reply that `write` has written.
    void answer(const ParcelWriter& write, android::status_t status = android::NO_ERROR);
    void fail(android::status_t status);
    void handle(Handler handler);
    /// Hands every further transaction on, so that a proxy and a stub meet in one process.
    void forwardTo(const android::sp<android::IBinder>& target);

    std::vector<Transaction> transactions() const;
    Transaction lastTransaction() const;
    void clearTransactions();

    /// What pingBinder(), linkToDeath() and unlinkToDeath() answer while the binder is alive. A
    /// link is kept only when its answer is 0.
    void setPingResult(android::status_t status);
    void setLinkResult(android::status_t status);
    void setUnlinkResult(android::status_t status);

    int linkCalls() const;
    int unlinkCalls() const;
    int pings() const;

    const android::String16& getInterfaceDescriptor() const override;
    android::status_t pingBinder() override;
    android::status_t linkToDeath(const android::sp<DeathRecipient>& recipient,
                                  void* cookie = nullptr, uint32_t flags = 0) override;
    android::status_t unlinkToDeath(const android::wp<DeathRecipient>& recipient,
                                    void* cookie = nullptr, uint32_t flags = 0,
                                    android::wp<DeathRecipient>* outRecipient = nullptr) override;

  protected:
    ~RecordingBinder() override = default;
    android::status_t onTransact(uint32_t code, const android::Parcel& data, android::Parcel* reply,
                                 uint32_t flags = 0) override;

  private:
    const android::String16 mDescriptor;
    mutable std::mutex mLock;
    Handler mHandler;
    std::vector<Transaction> mTransactions;
    android::status_t mPingResult = android::NO_ERROR;
    android::status_t mLinkResult = android::NO_ERROR;
    android::status_t mUnlinkResult = android::NO_ERROR;
    int mLinkCalls = 0;
    int mUnlinkCalls = 0;
    int mPings = 0;
};

}  // namespace pemaro::test
