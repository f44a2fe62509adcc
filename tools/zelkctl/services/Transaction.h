// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <cstddef>

namespace pemaro::zelkctl {

/// What one Binder transaction can carry at most: libbinder maps this much for a process.
constexpr size_t kTransactionBytes = (1 << 20) - 2 * 4096;

}  // namespace pemaro::zelkctl
