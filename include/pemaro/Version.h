// SPDX-License-Identifier: Apache-2.0
#pragma once

/// The version of the library, its headers and its tools, by the rules of semantic versioning. This
/// line is the one place that holds it: the build, the packages and `--version` read it here.
#define ZELK_VERSION "1.0.0"
