// SPDX-License-Identifier: Apache-2.0

// Reading, writing, copying and looking up, by this library and by those that a user would take
// otherwise, with the same texts. Each benchmark is named operation/payload/who; "floor" makes the same
// tree without reading anything (Floor.h). What is made is also destroyed in the time measured.

#include <benchmark/benchmark.h>
#include <rapidjson/document.h>
#include <rapidjson/stringbuffer.h>
#include <rapidjson/writer.h>

#include <cstdio>
#include <cstdlib>
#include <nlohmann/json.hpp>
#include <string>

#include "bench/Floor.h"
#include "bench/Payloads.h"
#include "pemaro/SerializableMap.h"
#include "pemaro/SerializableMapArray.h"
#include "values/NumberText.h"

namespace pemaro::bench {
namespace {

SerializableMap mapOf(const std::string& text) {
    SerializableMap map;
    if (map.unserialize(text) != 0) abort();
    return map;
}

void setBytes(benchmark::State& state, const std::string& text) {
    state.SetBytesProcessed(static_cast<int64_t>(state.iterations() * text.size()));
}

// ---- this library ------------------------------------------------------------------------------

void readZelk(benchmark::State& state, const std::string& text) {
    for (auto _ : state) {
        SerializableMap map;
        benchmark::DoNotOptimize(map.unserialize(text));
    }
    setBytes(state, text);
}

void writeZelk(benchmark::State& state, const std::string& text) {
    const SerializableMap map = mapOf(text);
    for (auto _ : state) benchmark::DoNotOptimize(map.serialize());
    setBytes(state, text);
}

void copyZelk(benchmark::State& state, const std::string& text) {
    const SerializableMap map = mapOf(text);
    for (auto _ : state) {
        const SerializableMap copy(map);
        benchmark::DoNotOptimize(&copy);
    }
    setBytes(state, text);
}

void buildFloor(benchmark::State& state, const std::string& text) {
    const Floor floor(mapOf(text));
    for (auto _ : state) {
        SerializableMap map;
        floor.build(map);
        benchmark::DoNotOptimize(&map);
    }
    setBytes(state, text);
}

// ---- RapidJSON: numbers become numbers, strings stay in a pool -------------------------------------

void readRapidJson(benchmark::State& state, const std::string& text) {
    for (auto _ : state) {
        rapidjson::Document document;
        document.Parse(text.data(), text.size());
        benchmark::DoNotOptimize(document.HasParseError());
    }
    setBytes(state, text);
}

void writeRapidJson(benchmark::State& state, const std::string& text) {
    rapidjson::Document document;
    document.Parse(text.data(), text.size());
    for (auto _ : state) {
        rapidjson::StringBuffer buffer;
        rapidjson::Writer<rapidjson::StringBuffer> writer(buffer);
        document.Accept(writer);
        benchmark::DoNotOptimize(buffer.GetString());
    }
    setBytes(state, text);
}

void copyRapidJson(benchmark::State& state, const std::string& text) {
    rapidjson::Document document;
    document.Parse(text.data(), text.size());
    for (auto _ : state) {
        rapidjson::Document copy;
        copy.CopyFrom(document, copy.GetAllocator());
        benchmark::DoNotOptimize(&copy);
    }
    setBytes(state, text);
}

// ---- nlohmann: a std::map of variants --------------------------------------------------------------

void readNlohmann(benchmark::State& state, const std::string& text) {
    for (auto _ : state) benchmark::DoNotOptimize(nlohmann::json::parse(text));
    setBytes(state, text);
}

void writeNlohmann(benchmark::State& state, const std::string& text) {
    const nlohmann::json document = nlohmann::json::parse(text);
    for (auto _ : state) benchmark::DoNotOptimize(document.dump());
    setBytes(state, text);
}

void copyNlohmann(benchmark::State& state, const std::string& text) {
    const nlohmann::json document = nlohmann::json::parse(text);
    for (auto _ : state) {
        const nlohmann::json copy(document);
        benchmark::DoNotOptimize(&copy);
    }
    setBytes(state, text);
}

struct Contender {
    const char* operation;
    const char* name;
    void (*run)(benchmark::State& state, const std::string& text);
};

constexpr Contender kContenders[] = {
        {"read", "zelk", readZelk},           {"read", "floor", buildFloor},
        {"read", "rapidjson", readRapidJson}, {"read", "nlohmann", readNlohmann},
        {"write", "zelk", writeZelk},         {"write", "rapidjson", writeRapidJson},
        {"write", "nlohmann", writeNlohmann}, {"copy", "zelk", copyZelk},
        {"copy", "floor", buildFloor},        {"copy", "rapidjson", copyRapidJson},
        {"copy", "nlohmann", copyNlohmann},
};

/// The contenders of one payload follow each other, so that what is compared runs at the same time.
[[maybe_unused]] const bool gRegistered = [] {
    for (const Payload& payload : payloads()) {
        for (const Contender& contender : kContenders) {
            const std::string name =
                    std::string(contender.operation) + '/' + payload.name + '/' + contender.name;
            benchmark::RegisterBenchmark(name.c_str(), [&](benchmark::State& state) {
                contender.run(state, payload.text);
            });
        }
    }
    return true;
}();

// ---- looking up: every key of a thousand, in another order ----------------------------------------

std::vector<std::string> keysOf(const std::string& text) {
    const nlohmann::json document = nlohmann::json::parse(text);
    std::vector<std::string> keys;
    for (const auto& entry : document.items()) keys.push_back(entry.key());
    std::vector<std::string> mixed;
    for (size_t i = 0; i < keys.size(); ++i) mixed.push_back(keys[i * 389 % keys.size()]);
    return mixed;
}

template <typename Use>
void lookUp(benchmark::State& state, Use use) {
    const std::vector<std::string> keys = keysOf(payload("flat").text);
    for (auto _ : state) {
        for (const std::string& key : keys) benchmark::DoNotOptimize(use(key));
    }
    state.SetItemsProcessed(static_cast<int64_t>(state.iterations() * keys.size()));
}

void lookUpContains(benchmark::State& state) {
    SerializableMap map = mapOf(payload("flat").text);
    lookUp(state, [&](const std::string& key) { return map.contains(key); });
}
BENCHMARK(lookUpContains)->Name("lookup/contains/zelk");

void lookUpContainsText(benchmark::State& state) {
    SerializableMap map = mapOf(payload("flat").text);
    lookUp(state, [&](const std::string& key) { return map.contains(key.c_str()); });
}
BENCHMARK(lookUpContainsText)->Name("lookup/containsText/zelk");

void lookUpType(benchmark::State& state) {
    SerializableMap map = mapOf(payload("flat").text);
    lookUp(state, [&](const std::string& key) { return map.getType(key); });
}
BENCHMARK(lookUpType)->Name("lookup/getType/zelk");

void lookUpPlatform(benchmark::State& state) {
    const SerializableMap map = mapOf(payload("flat").text);
    lookUp(state, [&](const std::string& key) { return map.indexOfKey(key); });
}
BENCHMARK(lookUpPlatform)->Name("lookup/indexOfKey/platform");

void lookUpRapidJson(benchmark::State& state) {
    rapidjson::Document document;
    document.Parse(payload("flat").text.c_str());
    lookUp(state, [&](const std::string& key) { return document.HasMember(key.c_str()); });
}
BENCHMARK(lookUpRapidJson)->Name("lookup/HasMember/rapidjson");

void lookUpNlohmann(benchmark::State& state) {
    const nlohmann::json document = nlohmann::json::parse(payload("flat").text);
    lookUp(state, [&](const std::string& key) { return document.contains(key); });
}
BENCHMARK(lookUpNlohmann)->Name("lookup/contains/nlohmann");

void merge(benchmark::State& state) {
    const SerializableMap odd = mapOf(payload("flat").text);
    const SerializableMap even = mapOf(payload("short").text);
    for (auto _ : state) {
        SerializableMap sum(odd);
        sum += even;
        benchmark::DoNotOptimize(&sum);
    }
}
BENCHMARK(merge)->Name("merge/flat+short/zelk");

// ---- numbers ---------------------------------------------------------------------------------------

constexpr float kFloats[] = {0.0f, 1.25f, -0.5f, 1234.5678f, 3.14159265f, 60000.0f, -1e-5f, 1e20f};

void formatFloats(benchmark::State& state) {
    size_t i = 0;
    for (auto _ : state) benchmark::DoNotOptimize(formatFloat(kFloats[i++ % 8]));
}
BENCHMARK(formatFloats)->Name("number/format/zelk");

void formatFloatsByPrintf(benchmark::State& state) {
    size_t i = 0;
    for (auto _ : state) {
        char buffer[51];
        snprintf(buffer, sizeof(buffer), "%f", static_cast<double>(kFloats[i++ % 8]));
        benchmark::DoNotOptimize(std::string(buffer));
    }
}
BENCHMARK(formatFloatsByPrintf)->Name("number/format/snprintf");

constexpr const char* kFloatTexts[] = {"0.000000", "1.250000",     "-0.500000", "1234.567749",
                                       "3.141593", "60000.000000", "-0.000010", "42"};

void scanFloats(benchmark::State& state) {
    size_t i = 0;
    float value = 0;
    for (auto _ : state) {
        benchmark::DoNotOptimize(scanFloat(kFloatTexts[i++ % 8], value));
        benchmark::DoNotOptimize(value);
    }
}
BENCHMARK(scanFloats)->Name("number/scan/zelk");

void scanFloatsByScanf(benchmark::State& state) {
    size_t i = 0;
    float value = 0;
    for (auto _ : state) {
        benchmark::DoNotOptimize(sscanf(kFloatTexts[i++ % 8], "%f", &value));
        benchmark::DoNotOptimize(value);
    }
}
BENCHMARK(scanFloatsByScanf)->Name("number/scan/sscanf");

}  // namespace
}  // namespace pemaro::bench
