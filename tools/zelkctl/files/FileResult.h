// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>

#include "pemaro/Status.h"

namespace pemaro::zelkctl {

/// How a file fared: a status that names the kind of failure, and what it was in particular.
struct FileResult {
    int status = STATUS_NO_ERROR;
    std::string detail;

    bool isGood() const { return status == STATUS_NO_ERROR; }
};

}  // namespace pemaro::zelkctl
