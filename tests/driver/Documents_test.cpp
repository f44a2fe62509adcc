// SPDX-License-Identifier: Apache-2.0
// The programs and the sessions that stand in the documents, against the simulated touch stack, and the
// commands that try the tutorial's services.

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <stdlib.h>
#include <unistd.h>

#include <filesystem>
#include <fstream>
#include <sstream>
#include <string>
#include <vector>

#include "tests/driver/DriverSetting.h"

using testing::EndsWith;
using testing::MatchesRegex;

namespace pemaro::test {

namespace {

// The blocks of these documents that are of one language, and where the commands in them are found.
class Blocks : public ::testing::Test {
  protected:
    static constexpr char kPrompt[] = "desk:~# ";

    void SetUp() override {
        char folder[] = "/tmp/zelk-blocks-XXXXXX";
        ASSERT_NE(nullptr, mkdtemp(folder));
        mFolder = folder;
        std::filesystem::current_path(mFolder);  // some commands write a file
        const std::string service = platformBinary("service");
        const std::string path = binary("") + ":" + service.substr(0, service.rfind('/')) + ":" +
                                 (getenv("PATH") != nullptr ? getenv("PATH") : "");
        setenv("PATH", path.c_str(), 1);
    }

    void TearDown() override {
        std::filesystem::current_path("/");
        std::filesystem::remove_all(mFolder);
    }

    std::vector<std::string> blocksOf(const std::string& document, const std::string& language) {
        const RunResult extracted = run({ZELK_SOURCE_DIR "/tests/docs/extract-blocks", mFolder,
                                         ZELK_SOURCE_DIR "/" + document});
        EXPECT_EQ(0, extracted.status) << extracted.errors;
        std::vector<std::string> texts;
        for (const auto& entry : std::filesystem::directory_iterator(mFolder)) {
            if (entry.path().extension() == "." + language) {
                std::stringstream text;
                text << std::ifstream(entry.path()).rdbuf();
                texts.push_back(text.str());
            }
        }
        return texts;
    }

    std::string mFolder;
};

}  // namespace

TEST_F(Blocks, OfTheReadmeShowWhatTheDeskShows) {
    TouchStack stack;
    int commands = 0;
    for (const std::string& text : blocksOf("README.md", "text")) {
        std::string command;
        std::string shown;
        const auto compare = [&] {
            if (!command.empty()) {
                const RunResult result = run({"bash", "-o", "pipefail", "-c", command});
                EXPECT_EQ(0, result.status) << command << ": " << result.errors;
                EXPECT_EQ(shown, result.output) << command;
                ++commands;
            }
        };
        for (const std::string& line : splitLines(text)) {
            if (line.rfind(kPrompt, 0) == 0) {
                compare();
                command = line.substr(sizeof(kPrompt) - 1);
                shown.clear();
            } else {
                shown += line + "\n";
            }
        }
        compare();
    }
    EXPECT_LE(6, commands) << "is the prompt another one?";
}

TEST_F(Blocks, OfTheTutorialTryItsServices) {
    const std::vector<std::string> blocks = blocksOf("docs/service-tutorial.md", "sh");
    EXPECT_EQ(2u, blocks.size());
    for (const std::string& block : blocks) {
        const RunResult result =
                run({"bash", "-euo", "pipefail", "-c", block + "\nkill -0 $!\nkill $!\n"});
        EXPECT_EQ(0, result.status) << block << result.output << result.errors;
    }
}

TEST(Documents, ManualLinked) {
    TouchStack stack;
    const RunResult result = run({binary("manual_watch")});
    EXPECT_EQ(0, result.status) << result.errors;
    EXPECT_THAT(result.output, MatchesRegex("[1-9][0-9]* frames, [1-9][0-9]* gestures\n"));
}

TEST(Documents, ManualLinkedTellsWhatFailed) {
    TouchStack stack({"--fault", "gesture.startGestureDetection=status:0x40000010"});
    const RunResult result = run({binary("manual_watch")});
    EXPECT_EQ(1, result.status);
    // Behind the log of the library.
    EXPECT_THAT(result.errors, EndsWith("\ndetection: Error involving AFE HAL\n"));
}

TEST(Documents, ManualByName) {
    TouchStack stack;
    const RunResult result = run({binary("manual_by_name"), ZELK_LIBRARY});
    EXPECT_EQ(0, result.status) << result.errors;
    EXPECT_THAT(result.output,
                MatchesRegex("status 0x0, [1-9][0-9]* frames, [1-9][0-9]* gestures\n"));
}

TEST(Documents, CheckOfAFileOfFrames) {
    TouchStack stack;
    const std::string file = "/tmp/frames-" + std::to_string(getpid());
    const RunResult recording =
            run({binary("zelkctl"), "record", "--frames", "20", "--output", file});
    EXPECT_EQ(0, recording.status) << recording.errors;
    const RunResult result = run({"python3", ZELK_DOCUMENT_PROGRAMS "/check_frames.py", file});
    EXPECT_EQ("20 frames\n", result.output) << result.errors;
    unlink(file.c_str());
}

}  // namespace pemaro::test
