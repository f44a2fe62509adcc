// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>

namespace pemaro::tools {

// The standard output as the programs write it: at once and whole, with the first failure kept.
// Nothing is written any more after a failure. All of it may be called from any thread.

/// To be called first: a standard stream that is closed is given /dev/null, so that no file takes
/// its place. A closed standard output counts as one that failed.
void openStandardStreams();

/// Writes to the standard output; false when that failed, now or before.
bool writeOutput(const void* data, size_t size);
bool writeOutput(const std::string& text);

/// The same without waiting: gives up, and writes less, when nobody takes it within a moment.
void tryWriteOutput(const std::string& text);

/// Notes that nobody reads the standard output any more.
void noteOutputClosed();

/// Why the standard output failed, in one sentence; empty as long as it did not.
std::string outputProblem();

/// Writes a line to the standard error; nothing can be done when that fails.
void writeError(const std::string& line);

}  // namespace pemaro::tools
