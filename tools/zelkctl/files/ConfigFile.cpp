// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/files/ConfigFile.h"

#include <fmt/core.h>

#include "tools/zelkctl/files/InputFile.h"

namespace pemaro::zelkctl {

FileResult readConfigFile(const std::string& path, size_t limit, std::string& bytes) {
    FileResult result = readInputFile(path, limit + 1, bytes);
    if (!result.isGood()) {
        return result;
    }
    if (bytes.size() > limit) {
        return {STATUS_DATA_EXCEEDS_BUFFER,
                fmt::format("{} has more than {} bytes, the most that a transaction carries", path,
                            limit)};
    }
    return {};
}

}  // namespace pemaro::zelkctl
