// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstddef>
#include <string>

namespace pemaro {

/// Stores a copy of `source`, with its NUL, into `*result` for the caller to free(): 0, or
/// STATUS_ERROR_ALLOCATING_MEMORY with a null `*result`. `allocate` is malloc.
int copyResultText(const std::string& source, char** result, void* (*allocate)(size_t));

}  // namespace pemaro
