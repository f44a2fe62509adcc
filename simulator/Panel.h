// SPDX-License-Identifier: Apache-2.0
#pragma once

namespace pemaro::simulator {

/// The simulated panel, in pixels: what the configuration tells, and what positions and regions
/// refer to.
constexpr int kPanelWidth = 1080;
constexpr int kPanelHeight = 2340;

}  // namespace pemaro::simulator
