// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>
#include <vector>

#include "pemaro/SerializableMap.h"
#include "tools/zelkctl/terminal/Json.h"

namespace pemaro::zelkctl {

// Maps of typed values as a user sees and writes them.

/// What keeps a text from being a key: it is written between quotes, and the text form of a map has
/// no way to quote a quote. Empty when nothing does.
std::string keyProblem(const std::string& key);

/// The keys, in the order of the map.
std::vector<std::string> keysOf(SerializableMap& map);

/// "key=value" lines, without the last line's end; maps and arrays in their text form.
std::string linesOf(SerializableMap& map, const std::vector<std::string>& keys);

/// Adds entries to an object: numbers as numbers, maps as maps.
void addEntries(JsonObject& object, SerializableMap& map, const std::vector<std::string>& keys);

/// Prints the entries of these keys, or without keys all of them; the exit status. What is not there
/// is told, and then nothing is printed.
int sayEntries(const std::string& command, SerializableMap& map,
               const std::vector<std::string>& keys);

/// Reads KEY=VALUE pairs. A value is a number, true, false, a text between quotes, or a map or an
/// array of such; whatever is none of these is a text. Empty, or what is wrong.
std::string readPairs(const std::vector<std::string>& pairs, SerializableMap& map);

}  // namespace pemaro::zelkctl
