// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/files/GestureFile.h"

#include <fmt/core.h>

#include <algorithm>
#include <cstring>

#include "tools/zelkctl/files/InputFile.h"

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
    // One record more than there may be tells that there are too many.
    const size_t room = limit - std::min(limit, records.size());
    std::string bytes;
    const FileResult result = readInputFile(path, (room + 1) * kRecord, bytes);
    if (!result.isGood()) {
        const bool isOpen = result.status != STATUS_ERROR_OPENING_FILE;
        return fmt::format("cannot {} {}", isOpen ? "read" : "open", result.detail);
    }
    const size_t count = bytes.size() / kRecord;
    if (count > room) {
        return fmt::format("{} makes it more than {} record{} of {} bytes", path, limit,
                           limit == 1 ? "" : "s", kRecord);
    }
    const size_t before = records.size();
    records.resize(before + count);
    if (count != 0) {
        memcpy(&records[before], bytes.data(), count * kRecord);
    }
    if (bytes.size() % kRecord != 0) {
        return refusal(path, bytes.size());
    }
    return records.size() > before ? "" : path + " is empty";
}

}  // namespace pemaro::zelkctl
