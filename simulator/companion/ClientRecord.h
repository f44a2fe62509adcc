// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <memory>  // before binder/IMemory.h, which uses it without including it

#include <binder/IBinder.h>
#include <binder/IMemory.h>
#include <sys/types.h>

#include <atomic>
#include <cstdint>
#include <string>
#include <vector>

#include "simulator/companion/Recording.h"
#include "simulator/companion/RingSink.h"
#include "simulator/companion/SimulatorOptions.h"

namespace pemaro::simulator {

/// What the service knows about one client process: the binders that it registered, and its
/// recording, which goes through idle, prepared and running. Not synchronised.
///
/// A call names its client by the calling process alone, so that two client objects of one process
/// share one record, and the record lives as long as any of them is registered.
class ClientRecord {
  public:
    ClientRecord(pid_t pid, const SimulatorOptions& options,
                 std::shared_ptr<const std::atomic<uint32_t>> filter);

    pid_t pid() const { return mPid; }

    void addHandle(const android::sp<android::IBinder>& handle) { mHandles.push_back(handle); }
    /// Forgets the handle registered last and returns it. REQUIRES: hasHandles().
    android::sp<android::IBinder> takeHandle();
    /// False when it was none of this client's.
    bool removeHandle(const android::IBinder* handle);
    bool hasHandles() const { return !mHandles.empty(); }

    bool isOpen() const { return mOpen; }
    bool isRecording() const { return mRecording != nullptr; }
    bool recordsToFile() const { return isRecording() && mRing == nullptr; }
    void open() { mOpen = true; }
    void close() { mOpen = false; }

    int setOutput(int output);
    int setFile(const std::string& path);
    int prepare();
    /// Null unless a recording to shared memory is prepared and not yet running.
    android::sp<android::IMemory> block() const;
    int start();
    int stop(Recording::Counts* counts);

  private:
    const pid_t mPid;
    const SimulatorOptions& mOptions;
    const std::shared_ptr<const std::atomic<uint32_t>> mFilter;
    std::vector<android::sp<android::IBinder>> mHandles;
    bool mOpen = false;
    bool mPrepared = false;
    int mOutput = -1;
    std::string mFile;
    std::shared_ptr<RingSink> mRing;
    std::unique_ptr<Recording> mRecording;
};

}  // namespace pemaro::simulator
