// SPDX-License-Identifier: Apache-2.0
#include "tests/driver/ProcessUsage.h"

#include <dirent.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <cstdio>
#include <fstream>
#include <iterator>
#include <string>

namespace pemaro::test {

namespace {

int countEntries(const std::string& folder) {
    int count = 0;
    DIR* directory = opendir(folder.c_str());
    while (directory != nullptr && readdir(directory) != nullptr) {
        ++count;
    }
    if (directory != nullptr) {
        closedir(directory);
    }
    return count;
}

int countLines(const std::string& path) {
    std::ifstream file(path);
    return static_cast<int>(std::count(std::istreambuf_iterator<char>(file),
                                       std::istreambuf_iterator<char>(), '\n'));
}

int residentKiB(const std::string& process) {
    std::ifstream file(process + "/status");
    for (std::string line; std::getline(file, line);) {
        int size = 0;
        if (sscanf(line.c_str(), "VmRSS: %d", &size) == 1) {
            return size;
        }
    }
    return 0;
}

}  // namespace

ProcessUsage::ProcessUsage(pid_t pid) {
    const std::string process = "/proc/" + std::to_string(pid);
    threads = countEntries(process + "/task");
    descriptors = countEntries(process + "/fd");
    mappings = countLines(process + "/maps");
    memoryKiB = residentKiB(process);
}

void expectNoGrowth(const ProcessUsage& before, const ProcessUsage& after, int leeway) {
    EXPECT_GT(before.threads, 0);
    EXPECT_GT(before.mappings, 0);
    EXPECT_LT(after.threads, before.threads + leeway);
    EXPECT_LT(after.descriptors, before.descriptors + leeway);
    EXPECT_LT(after.mappings, before.mappings + leeway);
}

}  // namespace pemaro::test
