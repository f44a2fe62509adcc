// SPDX-License-Identifier: Apache-2.0
#pragma once

/// Marks what `libzelkclient.so` exports; everything else in the library may be hidden.
#define ZELK_API __attribute__((visibility("default")))

/// Marks what an exported class keeps to itself.
#define ZELK_LOCAL __attribute__((visibility("hidden")))
