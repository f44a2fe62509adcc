// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <gtest/gtest.h>
#include <stdlib.h>

#include <cstddef>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <string>

namespace pemaro::test {

/// A test in an empty folder of its own, which is gone with it.
class FolderTest : public ::testing::Test {
  protected:
    FolderTest() { EXPECT_NE(nullptr, mkdtemp(&folder[0])); }
    ~FolderTest() override { std::filesystem::remove_all(folder); }

    std::string path(const std::string& name) const { return folder + "/" + name; }

    /// Makes a file of these bytes, and returns its path.
    std::string write(const std::string& name, const std::string& content) const {
        std::ofstream(path(name), std::ios::binary) << content;
        return path(name);
    }

    static std::string contents(const std::string& file) {
        std::ifstream stream(file, std::ios::binary);
        return {std::istreambuf_iterator<char>(stream), {}};
    }

    /// How many there are, of whatever kind.
    size_t files() const {
        return static_cast<size_t>(std::distance(std::filesystem::directory_iterator(folder), {}));
    }

    std::string folder = testing::TempDir() + "zelk-test.XXXXXX";
};

}  // namespace pemaro::test
