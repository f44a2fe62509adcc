// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>

#include "tools/zelkctl/terminal/Json.h"

namespace pemaro::zelkctl {

// What a command prints that it has to say, as against the data that it was told to write.

/// The name that stands for the standard output where a file is due.
constexpr const char* kStandardOutput = "-";

/// Whether a file to write is the standard output, by this name or by that of its descriptor, as
/// /dev/stdout is.
bool isStandardOutput(const std::string& path);

/// From now on the standard output carries data, and words go to the standard error.
void giveOutputToData();

/// The descriptor on which words appear.
int wordsDescriptor();

/// Prints a line at once. A failure is kept by the standard output, and ends the command.
void say(const std::string& line);

/// Prints what came of a command: a text of one or more lines, or with --json the object.
void sayResult(const std::string& text, JsonObject& object);

/// Something to know that is no failure, on the standard error.
void note(const std::string& text);

}  // namespace pemaro::zelkctl
