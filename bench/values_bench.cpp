// SPDX-License-Identifier: Apache-2.0

// Reading, writing and copying maps, beside RapidJSON doing the same with the same text (its document
// keeps numbers as numbers, not as text); numbers to text and back, beside snprintf and sscanf.

#include <benchmark/benchmark.h>
#include <rapidjson/document.h>
#include <rapidjson/stringbuffer.h>
#include <rapidjson/writer.h>

#include <cstdio>
#include <cstdlib>
#include <string>

#include "pemaro/SerializableMap.h"
#include "pemaro/SerializableMapArray.h"
#include "values/NumberText.h"

namespace {

using pemaro::SerializableMap;
using pemaro::SerializableMapArray;

/// A command's request, as it crosses Binder with each call.
std::string smallText() {
    return "{\"DEBUG_COMMAND\":{\"ARGS\":[\"12\",\"34\"],\"NAME\":\"set_gain\"},\"VERSION\":3}";
}

/// A configuration: many entries of one map, in the order of their keys.
std::string flatText() {
    std::string text = "{";
    for (int i = 0; i < 2000; ++i) {
        char entry[64];
        snprintf(entry, sizeof(entry), "%s\"parameter_%04d\":%d.%06d", i == 0 ? "" : ",", i, i,
                 i * 7);
        text += entry;
    }
    return text + "}";
}

/// An array of arrays of small numbers, as an image has.
std::string listText() {
    std::string text = "{\"rows\":[";
    for (int row = 0; row < 40; ++row) {
        text += row == 0 ? "[" : ",[";
        for (int column = 0; column < 60; ++column) {
            text += (column == 0 ? "" : ",") + std::to_string(row * column);
        }
        text += "]";
    }
    return text + "]}";
}

std::string deepText() {
    std::string text;
    for (int i = 0; i < 1000; ++i) text += "{\"a\":[";
    text += "1";
    for (int i = 0; i < 1000; ++i) text += "]}";
    return text;
}

using MakeText = std::string (*)();

SerializableMap mapOf(const std::string& text) {
    SerializableMap map;
    if (map.unserialize(text) != 0) abort();
    return map;
}

void readMap(benchmark::State& state, MakeText make) {
    const std::string text = make();
    for (auto _ : state) {
        SerializableMap map;
        benchmark::DoNotOptimize(map.unserialize(text));
    }
    state.SetBytesProcessed(static_cast<int64_t>(state.iterations() * text.size()));
}

void writeMap(benchmark::State& state, MakeText make) {
    const std::string text = make();
    const SerializableMap map = mapOf(text);
    for (auto _ : state) benchmark::DoNotOptimize(map.serialize());
    state.SetBytesProcessed(static_cast<int64_t>(state.iterations() * text.size()));
}

void copyMap(benchmark::State& state, MakeText make) {
    const std::string text = make();
    const SerializableMap map = mapOf(text);
    for (auto _ : state) {
        const SerializableMap copy(map);
        benchmark::DoNotOptimize(&copy);
    }
    state.SetBytesProcessed(static_cast<int64_t>(state.iterations() * text.size()));
}

void readRapidJson(benchmark::State& state, MakeText make) {
    const std::string text = make();
    for (auto _ : state) {
        rapidjson::Document document;
        document.Parse<rapidjson::kParseIterativeFlag>(text.c_str());
        benchmark::DoNotOptimize(document.HasParseError());
    }
    state.SetBytesProcessed(static_cast<int64_t>(state.iterations() * text.size()));
}

void writeRapidJson(benchmark::State& state, MakeText make) {
    const std::string text = make();
    rapidjson::Document document;
    document.Parse<rapidjson::kParseIterativeFlag>(text.c_str());
    for (auto _ : state) {
        rapidjson::StringBuffer buffer;
        rapidjson::Writer<rapidjson::StringBuffer> writer(buffer);
        document.Accept(writer);
        benchmark::DoNotOptimize(std::string(buffer.GetString(), buffer.GetSize()));
    }
    state.SetBytesProcessed(static_cast<int64_t>(state.iterations() * text.size()));
}

#define ZELK_BENCH_TEXTS(function)                 \
    BENCHMARK_CAPTURE(function, small, smallText); \
    BENCHMARK_CAPTURE(function, flat, flatText);   \
    BENCHMARK_CAPTURE(function, list, listText);   \
    BENCHMARK_CAPTURE(function, deep, deepText)

ZELK_BENCH_TEXTS(readMap);
ZELK_BENCH_TEXTS(readRapidJson);
ZELK_BENCH_TEXTS(writeMap);
ZELK_BENCH_TEXTS(writeRapidJson);
ZELK_BENCH_TEXTS(copyMap);

constexpr float kFloats[] = {0.0f, 1.25f, -0.5f, 1234.5678f, 3.14159265f, 60000.0f, -1e-5f, 1e20f};

void formatFloat(benchmark::State& state) {
    size_t i = 0;
    for (auto _ : state) benchmark::DoNotOptimize(pemaro::formatFloat(kFloats[i++ % 8]));
}
BENCHMARK(formatFloat);

void formatFloatByPrintf(benchmark::State& state) {
    size_t i = 0;
    for (auto _ : state) {
        char buffer[51];
        snprintf(buffer, sizeof(buffer), "%f", static_cast<double>(kFloats[i++ % 8]));
        benchmark::DoNotOptimize(std::string(buffer));
    }
}
BENCHMARK(formatFloatByPrintf);

constexpr const char* kFloatTexts[] = {"0.000000", "1.250000",     "-0.500000", "1234.567749",
                                       "3.141593", "60000.000000", "-0.000010", "42"};

void scanFloat(benchmark::State& state) {
    size_t i = 0;
    float value = 0;
    for (auto _ : state) {
        benchmark::DoNotOptimize(pemaro::scanFloat(kFloatTexts[i++ % 8], value));
        benchmark::DoNotOptimize(value);
    }
}
BENCHMARK(scanFloat);

void scanFloatByScanf(benchmark::State& state) {
    size_t i = 0;
    float value = 0;
    for (auto _ : state) {
        benchmark::DoNotOptimize(sscanf(kFloatTexts[i++ % 8], "%f", &value));
        benchmark::DoNotOptimize(value);
    }
}
BENCHMARK(scanFloatByScanf);

}  // namespace
