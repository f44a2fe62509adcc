// SPDX-License-Identifier: Apache-2.0
// The platform's own service command against our stub. It asks a service for its interface without the
// interface token, which our stub, unlike the platform's own, refuses.

#include <gtest/gtest.h>

#include "tests/driver/DriverSetting.h"

namespace pemaro::test {

TEST(ServiceCommand, FindsTheService) {
    EXPECT_EQ("Service pemaro.TouchService: not found\n",
              run({platformBinary("service"), "check", "pemaro.TouchService"}).output);
    TouchStack touchStack({"--services", "companion"});
    EXPECT_EQ("Service pemaro.TouchService: found\n",
              run({platformBinary("service"), "check", "pemaro.TouchService"}).output);
}

TEST(ServiceCommand, ListsTheServiceWithoutItsInterface) {
    TouchStack touchStack({"--services", "companion"});
    const RunResult list = run({platformBinary("service"), "list"});
    EXPECT_EQ(0, list.status);
    EXPECT_EQ(
            "Found 2 services:\n"
            "0\tmanager: [android.os.IServiceManager]\n"
            "1\tpemaro.TouchService: []\n",
            list.output);
}

TEST(ServiceCommand, CannotCallWhatTellsNoInterface) {
    TouchStack touchStack({"--services", "companion"});
    // 20 would be getPacketSize.
    const RunResult call = run({platformBinary("service"), "call", "pemaro.TouchService", "20"});
    EXPECT_EQ(10, call.status);
    EXPECT_NE(std::string::npos, call.errors.find("Service pemaro.TouchService does not exist"))
            << call.errors;
    EXPECT_EQ("", call.output);
}

TEST(ServiceCommand, LeavesTheServiceAsItWas) {
    TouchStack touchStack({"--services", "companion"});
    for (const char* code : {"0", "1", "20", "28", "29", "1598968902"}) {
        run({platformBinary("service"), "call", "pemaro.TouchService", code, "i32", "7"});
    }
    EXPECT_EQ(0, run({binary("zelkctl"), "ping"}).status);
}

}  // namespace pemaro::test
