// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>
#include <vector>

/// The texts that reading, writing and copying are measured with.
namespace pemaro::bench {

struct Payload {
    const char* name;
    std::string text;  ///< of a map, as its writer writes it
};

/// A command's request, flat configurations (of sorted and of shuffled keys, of long and of short
/// ones), maps of maps, maps and arrays in turn, long strings, an image's worth of numbers, and a
/// mebibyte of configuration.
const std::vector<Payload>& payloads();

/// The payload of that name, made anew; another name ends the program.
Payload payload(const std::string& name);

/// The text of one shape with `size` entries, elements or levels. The hostile shapes are those whose
/// reading a simpler reader would repeat.
struct Shape {
    const char* name;
    std::string (*text)(size_t size);
    bool ofArray = false;  ///< the text of an array, not of a map
};
const std::vector<Shape>& shapes();

}  // namespace pemaro::bench
