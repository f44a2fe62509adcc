// SPDX-License-Identifier: Apache-2.0

// Does one operation on one payload once, after a first time that fills the allocator's caches, in a
// function of its own: what an instruction counter is pointed at.

#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <functional>

#include "bench/Floor.h"
#include "bench/Measured.h"
#include "bench/Payloads.h"
#include "pemaro/SerializableMap.h"

namespace pemaro::bench {
namespace {

std::function<void()> operationOn(const std::string& name, const std::string& text) {
    if (name == "read") {
        return [&text] {
            SerializableMap map;
            if (map.unserialize(text) != 0) abort();
        };
    }
    static SerializableMap map;
    if (map.unserialize(text) != 0) abort();
    if (name == "floor") {
        static const Floor floor(map);
        return [] {
            SerializableMap built;
            floor.build(built);
        };
    }
    if (name == "write") {
        return [] {
            if (map.serialize().empty()) abort();
        };
    }
    if (name == "copy") {
        return [] {
            const SerializableMap copy(map);
            if (copy.size() != map.size()) abort();
        };
    }
    if (name == "merge") {
        return [] { map += map; };
    }
    if (name == "lookup") {
        return [] {
            if (map.contains("no such key") || map.getType("no such key") != 0) abort();
        };
    }
    fprintf(stderr, "values_cost: no operation is called '%s'\n", name.c_str());
    exit(2);
}

}  // namespace
}  // namespace pemaro::bench

int main(int argc, char** argv) {
    if (argc != 3) {
        fprintf(stderr, "usage: values_cost read|floor|write|copy|merge|lookup PAYLOAD\n");
        return 2;
    }
    const std::string text = pemaro::bench::payload(argv[2]).text;
    const std::function<void()> operation = pemaro::bench::operationOn(argv[1], text);
    operation();
    zelk_measured(operation);
    return 0;
}
