// SPDX-License-Identifier: Apache-2.0
// What zelk-reference makes of its own command line, and of files.

#include <gtest/gtest.h>
#include <stdlib.h>

#include <filesystem>
#include <fstream>
#include <iterator>
#include <string>
#include <vector>

#include "tests/support/ChildProcess.h"

namespace pemaro::test {

namespace {

class Reference : public ::testing::Test {
  protected:
    Reference() {
        EXPECT_NE(nullptr, mkdtemp(&folder[0]));
        pattern = folder + "/pattern";
        output = folder + "/output";
        std::ofstream(pattern) << ".Nm @PROGRAM@\n@EXIT@\n";
    }
    ~Reference() override { std::filesystem::remove_all(folder); }

    static RunResult make(std::vector<std::string> words) {
        words.insert(words.begin(), ZELK_BIN_DIR "/zelk-reference");
        return run(words);
    }

    std::string folder = testing::TempDir() + "Reference_test.XXXXXX";
    std::string pattern;
    std::string output;
};

}  // namespace

TEST_F(Reference, FillsATemplate) {
    const RunResult made = make({"zelkctl", "man", pattern, output});
    EXPECT_EQ(0, made.status);
    EXPECT_EQ("", made.errors);
    std::ifstream stream(output);
    const std::string text{std::istreambuf_iterator<char>(stream), {}};
    EXPECT_EQ(0u, text.find(".Nm zelkctl\n.Bl -tag")) << text;
}

TEST_F(Reference, RefusesWhatItCannotMake) {
    const struct {
        std::vector<std::string> words;
        int status;
        std::string error;
    } rows[] = {
            {{}, 2, "usage: zelk-reference zelkctl|zelk-touchstack bash|zsh|man TEMPLATE OUTPUT"},
            {{"zelkctl", "man", pattern},
             2,
             "usage: zelk-reference zelkctl|zelk-touchstack bash|zsh|man TEMPLATE OUTPUT"},
            {{"zelkctl", "fish", pattern, output}, 2, "there is no kind of reference 'fish'"},
            {{"zelk\x1b", "man", pattern, output}, 2, "there is no program 'zelk?'"},
            {{"zelkctl", "man", "/no/such", output},
             1,
             "cannot read /no/such: No such file or directory"},
            {{"zelkctl", "man", folder, output}, 1, "cannot read " + folder + ": Is a directory"},
            {{"zelkctl", "man", pattern, folder}, 1, "cannot write " + folder + ": Is a directory"},
    };
    for (const auto& row : rows) {
        const RunResult result = make(row.words);
        EXPECT_EQ(row.status, result.status) << row.error;
        EXPECT_EQ("zelk-reference: " + row.error + "\n", result.errors);
        EXPECT_FALSE(std::filesystem::exists(output)) << row.error;
    }
}

}  // namespace pemaro::test
