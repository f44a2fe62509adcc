// SPDX-License-Identifier: Apache-2.0
#include "frames/OwnDescriptor.h"

#include <android-base/file.h>
#include <android-base/parseint.h>
#include <android-base/strings.h>

namespace pemaro::frames {
namespace {

/// As many as the kernel follows.
constexpr int kMaxLinks = 40;

/// A number that is written as the kernel writes it, or -1.
int descriptorOf(const std::string& name) {
    int number = -1;
    return android::base::ParseInt(name, &number, 0) && std::to_string(number) == name ? number
                                                                                       : -1;
}

}  // namespace

int ownDescriptor(const std::string& path) {
    std::string own;
    if (!android::base::Realpath("/proc/self", &own)) {
        return -1;
    }
    own += '/';
    // Followed to its end, a path no longer tells that it led there.
    std::string next = path;
    for (int links = 0; links < kMaxLinks; ++links) {
        std::string folder;
        if (!android::base::Realpath(android::base::Dirname(next), &folder)) {
            return -1;
        }
        const std::string name = android::base::Basename(next);
        // Each thread has a folder of the same descriptors.
        if (android::base::StartsWith(folder, own) && android::base::EndsWith(folder, "/fd")) {
            return descriptorOf(name);
        }
        folder += '/';
        std::string target;
        if (!android::base::Readlink(folder + name, &target)) {
            return -1;
        }
        next = android::base::StartsWith(target, "/") ? target : folder + target;
    }
    return -1;
}

}  // namespace pemaro::frames
