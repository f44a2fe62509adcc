// SPDX-License-Identifier: Apache-2.0
#define LOG_TAG "TouchCompanionClient"

#include "pemaro/TouchCompanionClient.h"

#include <binder/IPCThreadState.h>
#include <errno.h>
#include <log/log.h>
#include <sys/uio.h>
#include <unistd.h>

#include <utility>

#include "binder/Guard.h"
#include "binder/PlatformShims.h"
#include "binder/ServiceLookup.h"
#include "companion/ClientFailure.h"
#include "companion/FrameDelivery.h"
#include "companion/RingReader.h"
#include "companion/TouchCompanionThread.h"
#include "pemaro/Status.h"

namespace pemaro {

using android::IBinder;
using android::IInterface;
using android::IPCThreadState;
using android::sp;

namespace {

constexpr char kServiceName[] = "pemaro.TouchService";

constexpr int kOutputNone = -1;
constexpr int kOutputFile = 0;
constexpr int kOutputMemory = 1;

using Service = ITouchCompanionService;

// False where `to` cannot be written to. The kernel says so where writing by ourselves would end the
// process; the flags of the memory's heap do not, since the platform loses them on the way.
bool writeThroughKernel(void* to, const void* from, size_t size) {
    iovec source = {const_cast<void*>(from), size};
    iovec target = {to, size};
    return process_vm_writev(getpid(), &source, 1, &target, 1, 0) != -1 || errno != EFAULT;
}

// Where the service's memory is mapped, if a control block can be worked with there; else null, with
// the reason logged unless nothing was mapped or there is no room for one. The block holds the
// ring's address in this process then.
TouchCompanionSharedCblk* usableBlock(const sp<android::IMemory>& memory) {
    void* const address = mappedAddress(memory);
    if (address == nullptr || memory->size() < sizeof(TouchCompanionSharedCblk)) {
        return nullptr;
    }
    if (reinterpret_cast<uintptr_t>(address) % alignof(TouchCompanionSharedCblk) != 0) {
        ALOGE("shared control block cannot be used: %p is not aligned to %zu bytes", address,
              alignof(TouchCompanionSharedCblk));
        return nullptr;
    }
    TouchCompanionSharedCblk* const cblk = static_cast<TouchCompanionSharedCblk*>(address);
    uint8_t* const data = cblk->frames();
    if (!writeThroughKernel(&cblk->data, &data, sizeof(data))) {
        ALOGE("shared control block cannot be used: it is mapped read-only");
        return nullptr;
    }
    // Where the kernel does not write for others at all.
    __atomic_store_n(&cblk->data, data, __ATOMIC_RELAXED);
    return cblk;
}

}  // namespace

// ---- connection ----

TouchCompanionClient::TouchCompanionClient() : TouchCompanionClient(nullptr, nullptr) {}

TouchCompanionClient::TouchCompanionClient(DataCallback callback, void* context)
        : mCallback(callback), mContext(context), mRecordOutput(kOutputNone) {}

TouchCompanionClient::~TouchCompanionClient() {
    if (mInitialized) {
        mService->unregisterClient();
    }
    // Whatever init() returned: who could not open the service may have recorded all the same.
    if (mThread != nullptr) {
        mThread->end();
        mThread.clear();
    }
    if (mInitialized) {
        IPCThreadState::self()->flushCommands();
    }
    mBinderHandle.clear();
    mCblkMemory.clear();
    mService.clear();
}

int TouchCompanionClient::init() {
    sp<IBinder> binder = findService(LOG_TAG, kServiceName);
    if (binder == nullptr) {
        return STATUS_ERROR_ACQUIRING_RESOURCE;
    }
    const sp<Service> service = Service::asInterface(binder);
    exchangeGuarded(mService, service);
    if (service == nullptr) {
        ALOGE("wrong service interface?");
        return STATUS_BAD_PARAMETER;
    }
    const sp<BinderHandle> handle = new BinderHandle();
    exchangeGuarded(mBinderHandle, handle);
    int status = service->registerClient(handle);
    if (status != STATUS_NO_ERROR) {
        ALOGE("registerClient failed");
        return status;
    }
    status = service->open();
    if (status != STATUS_NO_ERROR) {
        ALOGE("init service failed");
        return status;
    }
    exchangeGuarded(mInitialized, true);
    ALOGE("Init successfully");
    return STATUS_NO_ERROR;
}

int TouchCompanionClient::pingService() {
    sp<IBinder> binder = IInterface::asBinder(copyGuarded(mService));
    if (binder == nullptr) {
        ALOGD("binder error");
        return 0;
    }
    return binder->pingBinder() == android::NO_ERROR ? 1 : 0;
}

// ---- recording ----

int TouchCompanionClient::setRecordOutput(int output) {
    exchangeGuarded(mRecordOutput, output);
    return callService(kUnloggedFailure, mService, [&](Service& service) {
        int status = service.setRecordParameter(output);
        if (status != STATUS_NO_ERROR) {
            ALOGE("output parameter(%d) is wrong", output);
        }
        return status;
    });
}

int TouchCompanionClient::setRecordFile(const std::string& path) {
    if (copyGuarded(mRecordOutput) != kOutputFile) {
        ALOGE("setRecordFile can be called only with OUTPUT_FILE option");
        return STATUS_BAD_PARAMETER;
    }
    return callService(clientFailure("setDumpFile failed"), mService, &Service::setRecordFile,
                       path);
}

int TouchCompanionClient::startRecord() {
    const int output = copyGuarded(mRecordOutput);
    if (output == kOutputNone) {
        ALOGE("recording parameter is wrong(%d)", output);
        return STATUS_BAD_PARAMETER;
    }
    int status = callService(clientFailure("fail to prepare recording"), mService,
                             &Service::prepareRecord);
    if (status != STATUS_NO_ERROR) {
        return status;
    }
    if (output == kOutputMemory) {
        MappedBlock block;
        status = callService(kUnloggedFailure, mService,
                             [&](Service& service) { return mapBlock(service, block); });
        if (status != STATUS_NO_ERROR) {
            return status;
        }
        status = startThread(block);
        if (status != STATUS_NO_ERROR) {
            return status;
        }
    }
    return callService(clientFailure("startRecord failed"), mService, &Service::startRecord);
}

int TouchCompanionClient::mapBlock(Service& service, MappedBlock& block) {
    block.memory = service.getCblk();
    if (block.memory == nullptr) {
        ALOGE("couldn't get shared control block");
        return STATUS_ERROR_ACQUIRING_RESOURCE;
    }
    block.cblk = usableBlock(block.memory);
    if (block.cblk == nullptr) {
        return STATUS_ERROR_ACQUIRING_RESOURCE;
    }
    // A recording that was started twice has a thread in the old block.
    endThread();
    sp<android::IMemory> memory = block.memory;  // takes what is let go, outside the guard
    ClientGuard guard;
    mFrameCount = 0;  // the first frame sets the start's time
    mLastSecond = 0;
    std::swap(mCblkMemory, memory);
    mCblk = block.cblk;
    return STATUS_NO_ERROR;
}

int TouchCompanionClient::startThread(const MappedBlock& block) {
    if (mCallback == nullptr) {
        return STATUS_NO_ERROR;
    }
    ALOGD("Init: callback is set, create DebugThread");
    const sp<TouchCompanionThread> previous = copyGuarded(mThread);
    const sp<TouchCompanionThread> thread =
            new TouchCompanionThread(block, mCallback, mContext, previous);
    if (thread->run("TouchCompanionThread", 0, 0) != android::NO_ERROR) {
        ALOGE("the recording thread cannot be started");
        return STATUS_ERROR_ACQUIRING_RESOURCE;
    }
    // Two recordings that are started at once leave one thread.
    const sp<TouchCompanionThread> other = exchangeGuarded(mThread, thread);
    if (other != nullptr && other != previous) {
        other->end();
    }
    return STATUS_NO_ERROR;
}

void TouchCompanionClient::endThread() {
    const sp<TouchCompanionThread> thread = copyGuarded(mThread);
    if (thread == nullptr) {
        return;
    }
    thread->printRefs();
    // Whoever asks meanwhile waits as well; so does whoever asks after its callback did.
    if (thread->end()) {
        ClientGuard guard;
        if (mThread == thread) {
            mThread.clear();  // held by the caller still
        }
    }
}

int TouchCompanionClient::stopRecord() {
    ALOGD("stopRecord: E");
    endThread();
    ALOGD("stopRecord: call stopRecord on remote side");
    int status = callService(clientFailure("stopRecord failed"), mService, &Service::stopRecord);
    if (status != STATUS_NO_ERROR) {
        return status;
    }
    ALOGD("stopRecord: clear shared memory");
    sp<android::IMemory> memory;
    ClientGuard guard;
    std::swap(mCblkMemory, memory);
    mCblk = nullptr;
    return STATUS_NO_ERROR;
}

int TouchCompanionClient::read(void* /* buffer */, unsigned long /* size */) {
    return 0;
}

// ---- the ring, for those who take frames themselves ----

MappedBlock TouchCompanionClient::mappedBlock() const {
    ClientGuard guard;
    return {mCblkMemory, mCblk};
}

int TouchCompanionClient::acquireBuffer(FrameBuffer* buffer) {
    const MappedBlock block = mappedBlock();
    if (block.cblk == nullptr) {
        return STATUS_INVALID_STATE;
    }
    RingReader reader(block);
    return reader.acquire(reader.fields(), buffer);
}

void TouchCompanionClient::releaseBuffer(FrameBuffer* buffer) {
    const MappedBlock block = mappedBlock();
    if (block.cblk != nullptr) {
        RingReader reader(block);
        reader.release(reader.fields(), *buffer);
    }
}

void TouchCompanionClient::processData() {
    const MappedBlock block = mappedBlock();
    if (block.cblk == nullptr) {
        return;
    }
    FrameStatistics statistics{mFrameCount, mStartTime, mLastSecond};
    FrameDelivery(block, mCallback, mContext).pass(statistics);
    mFrameCount = statistics.frames;
    mStartTime = statistics.startTime;
    mLastSecond = statistics.lastSecond;
}

}  // namespace pemaro
