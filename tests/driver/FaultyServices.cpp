// SPDX-License-Identifier: Apache-2.0

/// faulty-services: the four services, without any of their functions: each call is answered with
/// the bytes that a test has ordered, late where it was told so, and not at all where it is to die.

#include "pemaro/Binder.h"

#include <binder/IServiceManager.h>
#include <binder/ProcessState.h>
#include <unistd.h>

#include <cstdio>

#include "tests/driver/FaultyServices.h"
#include "tests/faults/Operations.h"
#include "tests/faults/OrderedAnswers.h"
#include "tools/common/BinderDriver.h"

namespace pemaro::test {

namespace {

using android::Parcel;
using android::sp;
using android::status_t;
using android::String16;

OrderedAnswers gAnswers;

class FaultyService : public android::BBinder {
  public:
    status_t onTransact(uint32_t code, const Parcel& data, Parcel* reply, uint32_t flags) override {
        if (code > LAST_CALL_TRANSACTION) {
            return BBinder::onTransact(code, data, reply, flags);
        }
        if (code == kOrderTransaction) {
            gAnswers.order(readOrder(data));
            return android::NO_ERROR;
        }
        if (code == kStalledTransaction) {
            return reply->writeInt32(gAnswers.stalled());
        }
        if (!gAnswers.answer(code, reply)) {
            _exit(0);
        }
        return android::NO_ERROR;
    }
};

}  // namespace

}  // namespace pemaro::test

int main() {
    const std::string problem = pemaro::tools::binderProblem();
    if (!problem.empty()) {
        fprintf(stderr, "faulty-services: %s\n", problem.c_str());
        return 1;
    }
    android::ProcessState::self()->startThreadPool();
    for (const char* name : pemaro::test::kServices) {
        android::defaultServiceManager()->addService(android::String16(name),
                                                     new pemaro::test::FaultyService);
    }
    printf("process %d\n", getpid());
    fflush(stdout);
    pause();
}
