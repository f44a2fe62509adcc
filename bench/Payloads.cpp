// SPDX-License-Identifier: Apache-2.0
#include "bench/Payloads.h"

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <functional>
#include <random>

namespace pemaro::bench {

namespace {

/// `count` numbers from 0 on, shuffled alike in every run.
std::vector<int> shuffled(int count) {
    std::vector<int> numbers(static_cast<size_t>(count));
    for (int i = 0; i < count; ++i) numbers[static_cast<size_t>(i)] = i;
    std::mt19937 random(4711);
    for (size_t i = numbers.size(); i > 1; --i) std::swap(numbers[i - 1], numbers[random() % i]);
    return numbers;
}

std::vector<int> ascending(int count) {
    std::vector<int> numbers = shuffled(count);
    std::sort(numbers.begin(), numbers.end());
    return numbers;
}

/// A map with one entry, by a printf format of two numbers, for each of `numbers`.
std::string flat(const std::vector<int>& numbers, const char* format) {
    std::string text = "{";
    for (const int number : numbers) {
        char entry[96];
        snprintf(entry, sizeof(entry), format, number, number * 7 % 1000000);
        if (text.size() > 1) text += ',';
        text += entry;
    }
    return text + "}";
}

constexpr const char* kLongKey = "\"touch_parameter_%05d\":12.%06d";
constexpr const char* kShortKey = "\"p%05d\":%d";

std::string command() {
    return "{\"DEBUG_COMMAND\":{\"COMMAND\":\"set_gain\",\"PARAMS\":{\"MASK\":4294967295,"
           "\"NUM_OF_ELEMENTS\":6,\"VALUES\":[12,34,-5,6.250000,78,90]},\"TIMEOUT\":1500},"
           "\"REQUEST\":\"DEBUG\",\"SESSION\":12345,\"VERSION\":3}";
}

/// Modules of groups of parameters: some 70 KB.
std::string nestedMaps(int modules) {
    std::string text = "{";
    for (int module = 0; module < modules; ++module) {
        char head[48];
        snprintf(head, sizeof(head), "%s\"module_%04d\":{", module == 0 ? "" : ",", module);
        text += head;
        for (int group = 0; group < 4; ++group) {
            char entry[200];
            snprintf(entry, sizeof(entry),
                     "%s\"group_%d\":{\"calibration_offset\":-%d,\"enabled\":true,"
                     "\"gain\":%d.500000,\"name\":\"channel %d\",\"threshold_high\":%d,"
                     "\"threshold_low\":-%d}",
                     group == 0 ? "" : ",", group, module * 3, module, group, module + 300,
                     module + group);
            text += entry;
        }
        text += '}';
    }
    return text + "}";
}

/// Gestures of strokes of points: maps and short arrays in turn, some 70 KB.
std::string gestures(int count) {
    std::string text = "{\"gestures\":[";
    for (int gesture = 0; gesture < count; ++gesture) {
        char head[64];
        snprintf(head, sizeof(head), "%s{\"id\":%d,\"strokes\":[", gesture == 0 ? "" : ",",
                 gesture);
        text += head;
        for (int stroke = 0; stroke < 4; ++stroke) {
            char entry[160];
            snprintf(
                    entry, sizeof(entry), "%s{\"from\":[%d,%d],\"pressure\":0.%06d,\"to\":[%d,%d]}",
                    stroke == 0 ? "" : ",", gesture, stroke * 7, gesture * 31, stroke, gesture * 5);
            text += entry;
        }
        text += "]}";
    }
    return text + "]}";
}

std::string strings(int count, size_t length) {
    std::string text = "{";
    for (int i = 0; i < count; ++i) {
        char key[32];
        snprintf(key, sizeof(key), "%s\"note_%02d\":\"", i == 0 ? "" : ",", i);
        text += key;
        for (size_t n = 0; n < length; ++n) text += static_cast<char>('a' + (n * 7 + n / 31) % 26);
        text += '"';
    }
    return text + "}";
}

std::string numbers(int count) {
    std::string text = "{\"image\":[";
    for (int i = 0; i < count; ++i) {
        if (i != 0) text += ',';
        text += std::to_string(i * 37 % 65536);
    }
    return text + "]}";
}

std::string repeated(const std::string& piece, size_t count) {
    std::string text;
    text.reserve(piece.size() * count);
    for (size_t i = 0; i < count; ++i) text += piece;
    return text;
}

std::string enclosed(const std::string& open, const std::string& core, const std::string& close,
                     size_t count) {
    return repeated(open, count) + core + repeated(close, count);
}

struct Maker {
    const char* name;
    std::string (*make)();
};

constexpr Maker kMakers[] = {
        {"command", command},
        {"flat", [] { return flat(ascending(1000), kLongKey); }},
        {"random", [] { return flat(shuffled(1000), kLongKey); }},
        {"short", [] { return flat(ascending(1000), kShortKey); }},
        {"nested", [] { return nestedMaps(130); }},
        {"mixed", [] { return gestures(280); }},
        {"strings", [] { return strings(16, 4096); }},
        {"array", [] { return numbers(10000); }},
        {"flat1M", [] { return flat(ascending(29000), kLongKey); }},
        {"random1M", [] { return flat(shuffled(29000), kLongKey); }},
};

}  // namespace

const std::vector<Payload>& payloads() {
    static const std::vector<Payload> all = [] {
        std::vector<Payload> made;
        for (const Maker& maker : kMakers) made.push_back({maker.name, maker.make()});
        return made;
    }();
    return all;
}

Payload payload(const std::string& name) {
    for (const Maker& maker : kMakers) {
        if (name == maker.name) return {maker.name, maker.make()};
    }
    fprintf(stderr, "there is no payload '%s'\n", name.c_str());
    exit(2);
}

const std::vector<Shape>& shapes() {
    static const std::vector<Shape> all = {
            {"flat", [](size_t n) { return flat(ascending(static_cast<int>(n)), kLongKey); }},
            {"random", [](size_t n) { return flat(shuffled(static_cast<int>(n)), kLongKey); }},
            {"array", [](size_t n) { return numbers(static_cast<int>(n)); }},
            {"nested", [](size_t n) { return nestedMaps(static_cast<int>(n / 30 + 1)); }},
            {"deepMaps", [](size_t n) { return enclosed("{\"a\":", "{\"a\":1}", "}", n); }},
            {"deepArrays", [](size_t n) { return "{\"a\":" + enclosed("[", "1", "]", n) + "}"; }},
            // Hostile: each of these has a place to which a simpler reader would return again and again.
            {"unclosed", [](size_t n) { return repeated("{\"a\":[", n) + "}"; }},
            {"noTokenEnds", [](size_t n) { return "[" + repeated("x", n) + "\"]"; }, true},
            {"escapedQuotes", [](size_t n) { return "{\"a\":\"" + repeated("\\\"", n) + "\"}"; }},
            {"equalKeys", [](size_t n) { return "{" + repeated("\"a\":1,", n) + "\"b\":2}"; }},
            {"longEqualStarts",
             [](size_t n) {
                 std::string text = "{";
                 for (size_t i = n; i > 0; --i) {
                     text += '"' + repeated("k", 64) + std::to_string(i) + "\":1,";
                 }
                 return text + "\"b\":2}";
             }},
            {"bracketsInQuotes",
             [](size_t n) { return "{\"a\":[\"" + repeated("[{", n) + "\"]}"; }},
    };
    return all;
}

}  // namespace pemaro::bench
