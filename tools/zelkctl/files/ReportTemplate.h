// SPDX-License-Identifier: Apache-2.0
#pragma once

namespace pemaro::zelkctl {

/// The page that plays a recording, with marks where the recording's own goes: @SUMMARY@ (the JSON of
/// "frames stat"), @PALETTE@ (a JSON array of the colours of all levels) and @FRAMES@ (reportFrames(),
/// deflated, in base 64).
extern const char* const kReportTemplate;

}  // namespace pemaro::zelkctl
