// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "pemaro/Binder.h"
#include "pemaro/BnGestureManagerClient.h"
#include "pemaro/Export.h"
#include "pemaro/IGestureManagerService.h"

namespace pemaro {

/// A caller's handle on the gesture manager: wake-up gestures, gesture detection, the gestures that
/// the user defines, and a notice when the service dies.
///
/// It is the callback object that it subscribes, and reference-counted: hold it in an `android::sp`
/// before init() is called.
///
///     void onGesture(IGestureManagerClient::GestureData* data, void* context);
///     void onDeath(void* context);
///
///     android::sp<GestureManagerClient> client =
///             new GestureManagerClient(onGesture, onDeath, context);
///     int status = client->init();
///     if (status == 0) status = client->startGestureDetection();
///     ...
///     client->deinit();
///
/// Gestures and death notices come on Binder's threads. A native program has none until it
/// starts them, before init(); for an app the runtime has done it:
///
///     android::ProcessState::self()->startThreadPool();
///
/// Without them nothing fails, but no callback runs, and a service that reports a gesture waits for
/// this process until it ends.
///
/// The client does not reconnect by itself. After a death the caller calls deinit(), which lets go
/// of the dead service, and init(), which waits for a new one.
///
/// Every operation is one synchronous Binder call on the caller's thread and returns a status of
/// Status.h: 0, the service's own status unchanged, 0x40000000 when the transaction failed, or
/// 0x4000000B when the client holds no service (before init(), after deinit()). Failures are
/// logged. Operations, events, init() and deinit() may come from several threads at once; no lock
/// is held while one calls. A callback that runs when deinit() is called may still run when that
/// has returned, so what `ctx` points to must outlive it. Log tag: "GestureManagerClient".
class ZELK_API GestureManagerClient : public BnGestureManagerClient,
                                      public android::IBinder::DeathRecipient {
  public:
    /// Receives a gesture on a Binder thread: (record, context). The record is valid until the
    /// callback returns; it is null when the service sent none.
    using GestureCallback = void (*)(IGestureManagerClient::GestureData*, void*);

    /// Told on a Binder thread that the service died: (context).
    using DeathCallback = void (*)(void*);

    /// Without a callback its events are dropped; with a null context each event makes the client
    /// unsubscribe. `ctx` stays the caller's and is passed back unchanged.
    GestureManagerClient(GestureCallback gestureCb, DeathCallback deathCb, void* ctx);
    /// A client without callbacks and context, whose events are dropped.
    GestureManagerClient();

    /// Looks the service up, subscribes and watches for the service's death. 0x4000000A: no service
    /// manager or no such service; 0x40000000: subscribing failed, as it does with a service of
    /// another interface, or the service cannot be watched, as none can that is in this process;
    /// else what subscribing returned. (0x4000000D would be a binder that the platform makes no
    /// proxy for; its releases make one for any.)
    ///
    /// An absent service takes about 55 seconds: ten lookups, in each of which the platform waits
    /// for some five seconds by itself, and half a second of sleep after each. What an absent
    /// service manager means is told at TouchCompanionClient::init().
    ///
    /// Not guarded against a second call: deinit() comes before another init(). Without it the
    /// client subscribes and watches once more. deinit() then undoes one of each, and a death is
    /// told for each watch, also after deinit(). A second init() that the service refuses lets go
    /// of the service, and deinit() undoes nothing.
    int init();

    /// Unsubscribes and ends the watch, if init() had succeeded, and lets go of the service. Always
    /// 0.
    int deinit();

    /// See IGestureManagerService for these; verifyGesture() is its improveGestureTraining().
    int enableWakeup();
    int disableWakeup();
    int startGestureDetection();
    int stopGestureDetection();
    int addGesture(int count, IGestureManagerClient::GestureData* samples, int& result);
    int deleteGesture(int gesture);
    int enableGesture(int gesture);
    int disableGesture(int gesture);
    int verifyGesture(IGestureManagerClient::GestureData* sample, int& result);
    int getMaxPreDefinedGesture(unsigned int& count);
    int getMaxUserDefinedGesture(unsigned int& count);

    /// Called for the service on a Binder thread; hands the record to the callback. Always 0.
    int gestureCallback(IGestureManagerClient::GestureData* data) override;

    /// Called by Binder on one of its threads when the service's process died.
    void binderDied(const android::wp<android::IBinder>& who) override;

  protected:
    /// Neither unsubscribes nor ends the watch: the service keeps a client alive until deinit().
    ~GestureManagerClient() override;

  private:
    bool mInitialized = false;
    android::sp<IGestureManagerService> mService;
    GestureCallback mGestureCallback;
    DeathCallback mDeathCallback;
    void* mContext;
};

}  // namespace pemaro
