// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>
#include <vector>

#include "pemaro/Binder.h"
#include "pemaro/BnHandBiometricManagerClient.h"
#include "pemaro/Export.h"
#include "pemaro/IHandBiometricManagerService.h"

namespace pemaro {

/// A caller's handle on the hand biometric manager: enrollment, scanning and matching of hands,
/// their profiles, and a notice when the service dies.
///
/// It is the callback object that it subscribes, and reference-counted: hold it in an `android::sp`
/// before init() is called.
///
///     void onEvent(IHandBiometricManagerClient::HandBioData* data, void* context);
///     void onDeath(void* context);
///
///     android::sp<HandBiometricManagerClient> client =
///             new HandBiometricManagerClient(onEvent, onDeath, context);
///     int status = client->init();
///     if (status == 0) status = client->startEnrollment();  // its progress comes to onEvent
///     ...
///     client->deinit();
///
/// Events and death notices come on Binder's threads, which the process has to have: see
/// GestureManagerClient.
///
/// The client does not reconnect by itself. After a death the caller calls deinit(), which lets go
/// of the dead service, and init(), which waits for a new one.
///
/// Every operation is one synchronous Binder call on the caller's thread and returns a status of
/// Status.h: 0, the service's own status unchanged, 0x40000000 when the transaction failed, or
/// 0x4000000B when the client holds no service (before init(), after deinit()). Failures are
/// logged. Operations, events, init() and deinit() may come from several threads at once; no lock
/// is held while one calls. A callback that runs when deinit() is called may still run when that
/// has returned, so what `ctx` points to must outlive it. Log tag: "HandBiometricManagerClient".
class ZELK_API HandBiometricManagerClient : public BnHandBiometricManagerClient,
                                            public android::IBinder::DeathRecipient {
  public:
    /// Receives an event on a Binder thread: (record, context). The record is valid until the
    /// callback returns; it is null when the service sent none.
    using EventCallback = void (*)(IHandBiometricManagerClient::HandBioData*, void*);

    /// Told on a Binder thread that the service died: (context).
    using DeathCallback = void (*)(void*);

    /// Without a callback its events are dropped; with a null context each event makes the client
    /// unsubscribe. `ctx` stays the caller's and is passed back unchanged.
    HandBiometricManagerClient(EventCallback eventCb, DeathCallback deathCb, void* ctx);
    /// A client without callbacks and context, whose events are dropped.
    HandBiometricManagerClient();

    /// Looks the service up, subscribes and watches for the service's death. Statuses, the time
    /// that an absent service takes and what a second call does are those of
    /// GestureManagerClient::init(): deinit() comes before another init().
    int init();

    /// Unsubscribes and ends the watch, if init() had succeeded, and lets go of the service. Always
    /// 0.
    int deinit();

    /// See IHandBiometricManagerService for these. A null name is 0x4000001B; getProfileList()
    /// appends.
    int startEnrollment();
    int stopEnrollment();
    int scan();
    int startMatching();
    int stopMatching();
    int cancelScan();
    int setSecurity(int level);
    int setProfileName(const char* name);
    int deleteProfile(const char* name);
    int renameProfile(const char* first, const char* second);
    int getMaxUser(unsigned int& count);
    int getProfileList(std::vector<std::string>& names);
    int enableWakeup();
    int disableWakeup();

    /// Called for the service on a Binder thread; hands the record to the callback. Always 0.
    int handBiometricCallback(IHandBiometricManagerClient::HandBioData* data) override;

    /// Called by Binder on one of its threads when the service's process died.
    void binderDied(const android::wp<android::IBinder>& who) override;

  protected:
    /// Neither unsubscribes nor ends the watch: the service keeps a client alive until deinit().
    ~HandBiometricManagerClient() override;

  private:
    bool mInitialized = false;
    android::sp<IHandBiometricManagerService> mService;
    EventCallback mEventCallback;
    DeathCallback mDeathCallback;
    void* mContext;
};

}  // namespace pemaro
