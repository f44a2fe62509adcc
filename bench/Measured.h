// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <functional>

/// Does what is measured. The name is for an instruction counter to find; one for each program.
extern "C" __attribute__((noinline)) inline void zelk_measured(
        const std::function<void()>& operation) {
    operation();
}
