// SPDX-License-Identifier: Apache-2.0

// How reading grows with the text: each shape with n, 2n, 4n … entries, elements or levels, named
// shape/n. What grows linearly has the same time for a byte in all rows of its shape.

#include <benchmark/benchmark.h>

#include "bench/Payloads.h"
#include "pemaro/SerializableMap.h"
#include "pemaro/SerializableMapArray.h"

namespace pemaro::bench {
namespace {

template <typename Container>
void read(benchmark::State& state, const std::string& text) {
    for (auto _ : state) {
        Container container;
        benchmark::DoNotOptimize(container.unserialize(text));
    }
}

void grow(benchmark::State& state, const Shape& shape) {
    const std::string text = shape.text(static_cast<size_t>(state.range(0)));
    if (shape.ofArray) {
        read<SerializableMapArray>(state, text);
    } else {
        read<SerializableMap>(state, text);
    }
    state.SetBytesProcessed(static_cast<int64_t>(state.iterations() * text.size()));
    state.counters["textBytes"] = static_cast<double>(text.size());
}

[[maybe_unused]] const bool gRegistered = [] {
    for (const Shape& shape : shapes()) {
        benchmark::RegisterBenchmark(("grow/" + std::string(shape.name)).c_str(),
                                     [&shape](benchmark::State& state) { grow(state, shape); })
                ->RangeMultiplier(2)
                ->Range(1 << 12, 1 << 17);
    }
    return true;
}();

}  // namespace
}  // namespace pemaro::bench
