// SPDX-License-Identifier: Apache-2.0
#include "tests/driver/soak/SoakReport.h"

#include <android-base/unique_fd.h>
#include <fcntl.h>
#include <sys/mman.h>
#include <unistd.h>

#include <cstdio>

namespace pemaro::test {

void SoakReport::fail(const std::string& what) {
    if (problem[0] == '\0') {
        snprintf(problem, sizeof(problem), "%s", what.c_str());
    }
}

SoakReport* mapSoakReport(const std::string& path, bool create) {
    const int flags = O_RDWR | O_CLOEXEC | (create ? O_CREAT | O_TRUNC : 0);
    const android::base::unique_fd file(open(path.c_str(), flags, 0600));
    if (!file.ok() || (create && ftruncate(file.get(), sizeof(SoakReport)) != 0)) {
        return nullptr;
    }
    void* mapped =
            mmap(nullptr, sizeof(SoakReport), PROT_READ | PROT_WRITE, MAP_SHARED, file.get(), 0);
    return mapped == MAP_FAILED ? nullptr : static_cast<SoakReport*>(mapped);
}

void unmapSoakReport(SoakReport* report) {
    munmap(report, sizeof(*report));
}

}  // namespace pemaro::test
