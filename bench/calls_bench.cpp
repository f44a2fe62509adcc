// SPDX-License-Identifier: Apache-2.0

// A call through proxy and stub in one process, named call/operation/zelk, and call/operation/bare: the
// same by hand.

#include <benchmark/benchmark.h>

#include "bench/Calls.h"

int main(int argc, char** argv) {
    benchmark::Initialize(&argc, argv);
    if (benchmark::ReportUnrecognizedArguments(argc, argv)) return 1;
    for (const pemaro::bench::CallPair& pair : pemaro::bench::calls()) {
        const auto add = [&pair](const char* how, const pemaro::bench::Call& call) {
            benchmark::RegisterBenchmark(("call/" + pair.name + "/" + how).c_str(),
                                         [call](benchmark::State& state) {
                                             for (auto _ : state) call();
                                         });
        };
        add("zelk", pair.zelk);
        add("bare", pair.bare);
    }
    benchmark::RunSpecifiedBenchmarks();
    benchmark::Shutdown();
    return 0;
}
