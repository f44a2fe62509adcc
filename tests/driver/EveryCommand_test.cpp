// SPDX-License-Identifier: Apache-2.0
// What holds of each command of zelkctl, those included that come later: the command line tells which there are.

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <set>
#include <sstream>
#include <string>
#include <vector>

#include "tests/driver/CommandGroups.h"
#include "tests/driver/CommandRows.h"
#include "tests/driver/DriverSetting.h"
#include "tools/zelkctl/terminal/Json.h"

using testing::StartsWith;

namespace pemaro::test {

namespace {

constexpr size_t kGestureBytes = 72144;

// A command line whose words have spaces between; the folder of the test stands for FOLDER.
Words wordsOf(const std::string& line, const std::string& folder) {
    Words words;
    std::istringstream stream(line);
    for (std::string word; stream >> word;) {
        if (word.rfind("FOLDER", 0) == 0) {
            word = folder + word.substr(6);
        }
        words.push_back(word);
    }
    return words;
}

// The command that a line begins with, of one word or two.
std::string commandOf(const std::string& line, const CommandGroups& groups) {
    std::istringstream stream(line);
    std::string path;
    stream >> path;
    std::string second;
    if (groups.at(path) && stream >> second) {
        path += " " + second;
    }
    return path;
}

}  // namespace

TEST(EveryCommand, PrintsObjectsOnRequest) {
    TouchStack stack({"--gesture-rate", "50", "--hand-rate", "50"});
    // Somebody who is called, for the trace to tell of.
    ChildProcess watch({binary("zelkctl"), "touch", "watch"});
    Files files;
    // One after another: what one sets or makes, the next ones find.
    const std::string kTrace = "trace -n 1 -s 60";
    std::vector<std::string> lines = {
            "help",
            "help touch watch",
            "status",
            "status 0x4000000B",
            "info",
            "ping",
            "check hand",
            "record --frames 3 -o FOLDER/frames",
            "record-file FOLDER/own -s 0.2",
            "frames watch -s 1.5",
            "frames stat FOLDER/frames",
            "frames export FOLDER/frames -f json",
            "frames export FOLDER/frames -f csv -o FOLDER/csv",
            "frames export FOLDER/frames -f png -o FOLDER/pictures",
            "frames report FOLDER/frames -o FOLDER/page",
            "command status",
            "filter 3",
            "property get",
            "property set setRollingLogSize 5",
            "afe get",
            "afe get --channels",
            "afe set frequency=5",
            "event 1 2",
            "inspect",
            "packet-size",
            "auth zelk",
            "config list",
            "config get gain",
            "config set gain=2.5",
            "config dump FOLDER/binary",
            "config load FOLDER/binary",
            "config save FOLDER/saved",
            "config reload FOLDER/saved",
            "session save",
            "session list",
            "session restore 1",
            "touch features",
            "touch enable 1",
            "touch watch -n 1 -s 60",
            "touch region 1 2 3 4",
            kTrace,
            "touch disable 1",
            "gesture limits",
            "gesture list",
            "gesture wakeup on",
            "gesture detect start",
            "gesture watch -n 1 -s 60 -o FOLDER/gesture",
            "gesture add FOLDER/gesture",
            "gesture verify FOLDER/gesture",
            "gesture disable 9",
            "gesture enable 9",
            "gesture delete 9",
            "hand security 2",
            "hand wakeup on",
            "hand watch -n 1 -s 60",
            "hand enroll -n 7 -s 60",
            "hand name Anna",
            "hand rename Anna Bert",
            "hand profiles",
            "hand match -n 1 -s 60",
            "hand scan",
            "hand match",
            "hand cancel",
            "hand delete Bert",
    };
    const CommandGroups groups = readCommands();
    if (groups.count("trace") == 0) {  // a build without libtracefs
        lines.erase(std::find(lines.begin(), lines.end(), kTrace));
    }
    std::set<std::string> left;
    for (const auto& [path, isGroup] : groups) {
        if (!isGroup) {
            left.insert(path);
        }
    }
    for (const std::string& line : lines) {
        left.erase(commandOf(line, groups));
        SCOPED_TRACE(line);
        Words words = wordsOf(line, files.folder());
        words.emplace_back("--json");
        const RunResult result = zelkctl(words);
        EXPECT_EQ(0, result.status) << result.errors;
        EXPECT_NE("", result.output);
        for (const std::string& text : splitLines(result.output)) {
            EXPECT_TRUE(zelkctl::isJson(text)) << text;
            EXPECT_THAT(text, StartsWith("{"));
        }
        for (const std::string& text : splitLines(result.errors)) {
            EXPECT_TRUE(zelkctl::isJson(text)) << text;
        }
    }
    EXPECT_EQ(kGestureBytes, files.read("gesture").size());
    EXPECT_EQ(std::set<std::string>{}, left) << "no line has these commands";
}

}  // namespace pemaro::test
