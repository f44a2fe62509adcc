// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/files/GestureFile.h"

#include <fmt/core.h>

#include <cerrno>
#include <cstdio>
#include <cstring>
#include <memory>

namespace pemaro::zelkctl {
namespace {

constexpr size_t kRecord = sizeof(IGestureManagerClient::GestureData);

std::string refusal(const std::string& path, size_t bytes) {
    return fmt::format("{} holds {} bytes more than whole records of {} bytes", path,
                       bytes % kRecord, kRecord);
}

}  // namespace

std::string readGestures(const std::string& path, size_t limit,
                         std::vector<IGestureManagerClient::GestureData>& records) {
    const std::unique_ptr<FILE, int (*)(FILE*)> file(fopen(path.c_str(), "rbe"), fclose);
    if (file == nullptr) {
        return fmt::format("cannot open {}: {}", path, strerror(errno));
    }
    auto record = std::make_unique<IGestureManagerClient::GestureData>();
    const size_t before = records.size();
    size_t length = 0;
    while ((length = fread(record.get(), 1, kRecord, file.get())) == kRecord) {
        if (records.size() == limit) {
            return fmt::format("{} makes it more than {} record{} of {} bytes", path, limit,
                               limit == 1 ? "" : "s", kRecord);
        }
        records.push_back(*record);
    }
    if (ferror(file.get()) != 0) {
        return fmt::format("cannot read {}: {}", path, strerror(errno));
    }
    if (length != 0) {
        return refusal(path, length);
    }
    return records.size() > before ? "" : path + " is empty";
}

}  // namespace pemaro::zelkctl
