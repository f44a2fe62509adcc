// SPDX-License-Identifier: Apache-2.0
// What a caller owns, it releases: LeakSanitizer finds nothing after a caller that does, and tells of
// one that forgets. Built with AddressSanitizer alone.

#include <gtest/gtest.h>
#include <sanitizer/lsan_interface.h>

#include <cstdlib>
#include <memory>
#include <string>
#include <utility>

#include "pemaro/ITouchCompanionFacade.h"
#include "pemaro/ITouchCompanionFacadeOld.h"
#include "tests/companion/FactoryObject.h"
#include "tests/companion/TouchCompanionRemoteTest.h"

namespace pemaro::test {
namespace {

enum class Caller { kReleases, kForgets };

constexpr int kClean = 0;
constexpr int kLeaks = 3;

// Runs in the process of a death test: the answer is its exit status.
template <typename Use>
[[noreturn]] void useAndExit(Use use, Caller caller) {
    use(caller);
    // Another call over the same stack, so that no forgotten pointer is left there.
    use(Caller::kReleases);
    _exit(__lsan_do_recoverable_leak_check() != 0 ? kLeaks : kClean);
}

class Ownership : public TouchCompanionRemoteTest {
  protected:
    template <typename Use>
    void expectLeakOnlyIfForgotten(Use use) {
        EXPECT_EXIT(useAndExit(use, Caller::kReleases), ::testing::ExitedWithCode(kClean), "");
        EXPECT_EXIT(useAndExit(use, Caller::kForgets), ::testing::ExitedWithCode(kLeaks),
                    "detected memory leaks");
    }

    template <typename Interface>
    static void release(std::unique_ptr<Interface> object, Caller caller) {
        if (caller == Caller::kForgets) {
            object.release();
        }
    }
};

TEST_F(Ownership, TextOfACommandIsTheCallers) {
    for (const char* response :
         {R"({"DEBUG_COMMAND":{"RESPONSE":{"RESULTS":{"OUT_STRING":"done","OUT_VALUE":4}}}})",
          R"({"DEBUG_COMMAND":{"RESPONSE":{"RESULTS":{"OUT_VALUE":0}}}})", R"({"any":1})"}) {
        mService->response = mapOf(response);
        expectLeakOnlyIfForgotten([this](Caller caller) {
            char* result = nullptr;
            mClient->sendCommand("status 1 2", &result);
            if (caller == Caller::kReleases) {
                free(result);
            }
        });
    }
}

TEST_F(Ownership, ParameterObjectIsTheCallers) {
    expectLeakOnlyIfForgotten([](Caller caller) {
        auto params = make<ISerializableParams4>(4);
        store(*params, "gain", std::string(100, '3'));
        release(std::move(params), caller);
    });
}

TEST_F(Ownership, OlderParameterObjectIsTheCallers) {
    expectLeakOnlyIfForgotten([](Caller caller) {
        auto params = make<ISerializableParams3>(3);
        store(*params, "gain", std::string(100, '3'));
        release(std::move(params), caller);
    });
}

TEST_F(Ownership, FacadeIsTheCallers) {
    expectLeakOnlyIfForgotten([](Caller caller) {
        auto facade = make<ITouchCompanionFacade>(2048);
        facade->init(nullptr, nullptr);
        release(std::move(facade), caller);
    });
}

TEST_F(Ownership, OlderFacadeIsTheCallers) {
    expectLeakOnlyIfForgotten([](Caller caller) {
        auto facade = make<ITouchCompanionFacadeOld>(1792);
        facade->init(nullptr, nullptr);
        release(std::move(facade), caller);
    });
}

}  // namespace
}  // namespace pemaro::test
