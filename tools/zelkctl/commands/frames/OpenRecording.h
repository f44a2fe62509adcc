// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <memory>
#include <string>

#include "frames/RecordingFile.h"

namespace pemaro::zelkctl {

/// Opens a recording, and shows how far that is. Null with an exit status when it cannot be read or
/// the command was asked to stop, which has been told.
std::unique_ptr<frames::RecordingFile> openRecording(const std::string& path, int& exitStatus);

}  // namespace pemaro::zelkctl
