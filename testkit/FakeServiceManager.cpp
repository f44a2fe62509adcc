// SPDX-License-Identifier: Apache-2.0
#include "pemaro/testkit/FakeServiceManager.h"

#include <utils/String16.h>
#include <utils/String8.h>

#include <utility>

#include "pemaro/testkit/NativeBinder.h"

namespace pemaro::test {

namespace {

std::string textOf(const android::String16& name) {
    return android::String8(name).c_str();
}

}  // namespace

void FakeServiceManager::add(const std::string& name,
                             const android::sp<android::IBinder>& service) {
    android::sp<android::IBinder> held = service;  // takes what is let go, outside the lock
    std::lock_guard<std::mutex> lock(mLock);
    std::swap(mServices[name], held);
}

void FakeServiceManager::remove(const std::string& name) {
    android::sp<android::IBinder> held;
    std::lock_guard<std::mutex> lock(mLock);
    const auto found = mServices.find(name);
    if (found != mServices.end()) {
        std::swap(found->second, held);
        mServices.erase(found);
    }
}

int FakeServiceManager::lookups(const std::string& name) const {
    std::lock_guard<std::mutex> lock(mLock);
    auto found = mLookups.find(name);
    return found == mLookups.end() ? 0 : found->second;
}

void FakeServiceManager::onLookup(LookupHook hook) {
    std::lock_guard<std::mutex> lock(mLock);
    mHook.swap(hook);
}

android::sp<android::IBinder> FakeServiceManager::find(const android::String16& name16) const {
    std::string name = textOf(name16);
    LookupHook hook;
    int attempt;
    {
        std::lock_guard<std::mutex> lock(mLock);
        attempt = ++mLookups[name];
        hook = mHook;
    }
    if (hook) {
        hook(name, attempt);
    }
    std::lock_guard<std::mutex> lock(mLock);
    auto found = mServices.find(name);
    return found == mServices.end() ? nullptr : found->second;
}

android::sp<android::IBinder> FakeServiceManager::getService(const android::String16& name) const {
    return find(name);
}

android::sp<android::IBinder> FakeServiceManager::checkService(
        const android::String16& name) const {
    return find(name);
}

android::status_t FakeServiceManager::addService(const android::String16& name,
                                                 const android::sp<android::IBinder>& service,
                                                 bool /*allowIsolated*/, int /*dumpsysFlags*/) {
    add(textOf(name), service);
    return android::NO_ERROR;
}

android::Vector<android::String16> FakeServiceManager::listServices(int /*dumpsysFlags*/) {
    std::lock_guard<std::mutex> lock(mLock);
    android::Vector<android::String16> names;
    for (const auto& entry : mServices) {
        names.push(android::String16(entry.first.c_str()));
    }
    return names;
}

ScopedServiceManager::ScopedServiceManager() : mManager(new FakeServiceManager) {
    openDriver();
    useServiceManager(mManager);
}

ScopedServiceManager::~ScopedServiceManager() {
    useServiceManager(nullptr);
}

}  // namespace pemaro::test
