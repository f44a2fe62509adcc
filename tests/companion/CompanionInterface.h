// SPDX-License-Identifier: Apache-2.0
#pragma once

namespace pemaro::test {

// What the touch companion service is called: in the token of a request, and in its proxy's and stub's log.
inline constexpr char kDescriptor[] = "pemaro.TouchService";
inline constexpr char kTag[] = "ITouchCompanionService";

}  // namespace pemaro::test
