// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/files/ConfigFile.h"

#include <fmt/core.h>

#include <cerrno>
#include <cstdio>
#include <cstring>
#include <memory>

namespace pemaro::zelkctl {
namespace {

using File = std::unique_ptr<FILE, int (*)(FILE*)>;

FileResult failure(int status, const std::string& path) {
    return {status, path + ": " + strerror(errno)};
}

}  // namespace

FileResult readConfigFile(const std::string& path, size_t limit, std::string& bytes) {
    const File file(fopen(path.c_str(), "rbe"), fclose);
    if (file == nullptr) {
        return failure(STATUS_ERROR_OPENING_FILE, path);
    }
    bytes.resize(limit + 1);
    bytes.resize(fread(&bytes[0], 1, bytes.size(), file.get()));
    if (ferror(file.get()) != 0) {
        return failure(STATUS_ERROR_READING_FILE, path);
    }
    if (bytes.size() > limit) {
        return {STATUS_DATA_EXCEEDS_BUFFER,
                fmt::format("{} has more than {} bytes, the most that a transaction carries", path,
                            limit)};
    }
    return {};
}

}  // namespace pemaro::zelkctl
