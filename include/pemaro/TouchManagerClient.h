// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <ui/Rect.h>

#include "pemaro/Binder.h"
#include "pemaro/BnTouchManagerClient.h"
#include "pemaro/Export.h"
#include "pemaro/ITouchManagerService.h"

namespace pemaro {

/// A caller's handle on the touch manager: receives the gestures that the service detects, and
/// queries and switches its features.
///
/// It is the callback object that it subscribes, and reference-counted: hold it in an `android::sp`
/// before init() is called.
///
///     void onGesture(ITouchManagerClient::GestureData* data, void* context);
///
///     android::sp<TouchManagerClient> client = new TouchManagerClient(onGesture, context);
///     int status = client->init();
///     if (status == 0) status = client->enable(feature);  // onGesture runs on Binder's threads
///     ...
///     client->deinit();
///
/// Gestures come on Binder's threads, which the process has to have: see GestureManagerClient.
///
/// The callback and its context belong to the class: those of the client that was constructed last
/// serve every TouchManagerClient of the process.
///
/// Every operation is one synchronous Binder call on the caller's thread and returns a status of
/// Status.h: 0, the service's own status unchanged, 0x40000000 when the transaction failed, or
/// 0x4000000B when the client holds no service (before init(), after deinit()). Failures are
/// logged. Operations, events, init() and deinit() may come from several threads at once; no lock
/// is held while one calls. A callback that runs when deinit() is called, or when another client
/// replaces it, may still run when that has returned, so what `ctx` points to must outlive it. Log
/// tag: "TouchManagerClient".
class ZELK_API TouchManagerClient : public BnTouchManagerClient {
  public:
    /// Receives a gesture on a Binder thread: (record, context). The record is valid until the
    /// callback returns; it is null when the service sent none.
    using GestureCallback = void (*)(ITouchManagerClient::GestureData*, void*);

    /// Replaces the callback and the context of all clients. Without a callback gestures are
    /// dropped; with a null context each one makes the client that it reaches unsubscribe.
    TouchManagerClient(GestureCallback callback, void* ctx);
    /// Leaves the callback and the context as they are: null until a client was given some.
    TouchManagerClient();

    /// Looks the service up, once, and subscribes. 0x4000000A: no service manager or no such
    /// service (after the platform's own lookup gave up, some five seconds); 0x40000000:
    /// subscribing failed, as it does with a service of another interface; else what subscribing
    /// returned. (0x4000000D would be a binder that the platform makes no proxy for; its releases
    /// make one for any.) What an absent service manager means is told at
    /// TouchCompanionClient::init().
    ///
    /// Not guarded against a second call: deinit() comes before another init(). Without it the
    /// client subscribes once more, which deinit() undoes once.
    int init();

    /// Unsubscribes, if init() had succeeded, and lets go of the service. Always 0.
    int deinit();

    /// See ITouchManagerService for these.
    int isSupported(int feature, bool& supported);
    int isEnabled(int feature, bool& enabled);
    int enable(int feature);
    int disable(int feature);
    int configure_vm_region(android::Rect& region, bool flag);

    /// Called for the service on a Binder thread; hands the record to the callback. Always 0.
    int gestureCallback(ITouchManagerClient::GestureData* data) override;

  protected:
    /// Does not unsubscribe: the service keeps a client alive until deinit().
    ~TouchManagerClient() override;

  private:
    static GestureCallback mCallback;
    static void* mCtx;

    bool mInitialized = false;
    android::sp<ITouchManagerService> mService;
};

}  // namespace pemaro
