// SPDX-License-Identifier: Apache-2.0
// What "zelkctl frames export" makes of recordings.

#include <gtest/gtest.h>
#include <png.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <string>
#include <vector>

#include "frames/FrameContent.h"
#include "tests/tools/zelkctl/commands/frames/RecordingToLookInto.h"
#include "tools/zelkctl/terminal/Heat.h"

namespace pemaro::test {

namespace {

struct Picture {
    uint32_t width = 0;
    uint32_t height = 0;
    std::vector<uint8_t> pixels;  // red, green, blue

    std::vector<int> at(uint32_t x, uint32_t y) const {
        const uint8_t* pixel = &pixels[3 * (size_t{y} * width + x)];
        return {pixel[0], pixel[1], pixel[2]};
    }
};

Picture decode(const std::string& path) {
    png_image image{};
    image.version = PNG_IMAGE_VERSION;
    EXPECT_NE(0, png_image_begin_read_from_file(&image, path.c_str())) << image.message;
    image.format = PNG_FORMAT_RGB;
    Picture picture{image.width, image.height, std::vector<uint8_t>(PNG_IMAGE_SIZE(image))};
    EXPECT_NE(0, png_image_finish_read(&image, nullptr, picture.pixels.data(), 0, nullptr));
    return picture;
}

std::vector<int> heat(int value, int full) {
    const zelkctl::Color color = zelkctl::heatColor(zelkctl::heatLevel(value, full));
    return {color.red, color.green, color.blue};
}

class FramesExport : public ::testing::Test {
  protected:
    // The lines of an export in this format.
    std::vector<std::string> lines(const std::string& format, std::vector<std::string> words = {}) {
        words.insert(words.begin(), {"export", path, "--format", format});
        const RunResult result = framesCommand(words);
        EXPECT_EQ(0, result.status) << result.errors;
        return splitLines(result.output);
    }

    RecordingToLookInto recordings;
    const std::string path = recordings.write("frames", recordings.frames({0, 1, 2, 3, 4, 5, 6}));
};

}  // namespace

TEST_F(FramesExport, DrawsAHeatMapOfEachFrame) {
    const std::string folder = recordings.path("pictures");
    const RunResult result =
            framesCommand({"export", path, "-f", "png", "-o", folder, "--scale", "5"});
    EXPECT_EQ(0, result.status);
    EXPECT_EQ("7 pictures in " + folder + "\n", result.output);
    EXPECT_EQ("", result.errors);

    int full = 0;
    std::vector<frames::FrameContent> contents;
    for (uint32_t i = 0; i < 7; ++i) {
        const std::string bytes = recordings.frames({i});
        contents.push_back(frames::readFrameContent(bytes.data()));
        const auto& image = contents.back().image;
        full = std::max<int>(full, *std::max_element(image.begin(), image.end()));
    }
    for (uint32_t i = 0; i < 7; ++i) {
        const Picture picture = decode(folder + "/frame-00000" + std::to_string(i) + ".png");
        ASSERT_EQ(45u, picture.width);
        ASSERT_EQ(80u, picture.height);
        const frames::FrameContent& content = contents[i];
        for (uint32_t row = 0; row < 16; ++row) {
            for (uint32_t column = 0; column < 9; ++column) {
                // A corner of a cell: no arm of a cross reaches it.
                const std::vector<int> seen = picture.at(5 * column, 5 * row);
                EXPECT_TRUE(seen == heat(content.image[row * 9 + column], full) ||
                            seen == (std::vector<int>{255, 255, 255}))
                        << row << " " << column;
            }
        }
        for (const frames::FingerRecord& finger : content.fingers) {
            EXPECT_EQ((std::vector<int>{255, 255, 255}),
                      picture.at(2 + finger.x * 40 / 65535, 2 + finger.y * 75 / 65535));
        }
    }
}

TEST_F(FramesExport, LeavesOutFramesWithoutAnImage) {
    const std::string mixed = recordings.write(
            "mixed", recordings.frame(0, 0) + recordings.frame(1, 1, frames::kFilterFingers));
    const std::string folder = recordings.path("pictures");
    const RunResult result = framesCommand({"export", mixed, "-f", "png", "-o", folder});
    EXPECT_EQ(0, result.status);
    EXPECT_EQ("1 pictures in " + folder + ", 1 frames have no image\n", result.output);
    EXPECT_EQ("{\"pictures\":1,\"without_image\":1,\"folder\":\"" + folder + "\"}\n",
              framesCommand({"export", mixed, "-f", "png", "-o", folder, "--json"}).output);
    EXPECT_EQ(72u, decode(folder + "/frame-000000.png").width);
}

TEST_F(FramesExport, ListsTheFingers) {
    const std::vector<std::string> csv = lines("csv");
    ASSERT_EQ(15u, csv.size());
    EXPECT_EQ("frame,sequence,time_ns,finger,x,y,peak", csv[0]);
    const std::string bytes = recordings.frames({3});
    const frames::FingerRecord finger = frames::readFrameContent(bytes.data()).fingers[1];
    EXPECT_EQ("3,3,5012000000,1," + std::to_string(finger.x) + "," + std::to_string(finger.y) +
                      "," + std::to_string(finger.peak),
              csv[8]);
}

TEST_F(FramesExport, ListsTheCells) {
    const std::vector<std::string> csv = lines("cells");
    ASSERT_EQ(1 + 7 * 16u, csv.size());
    EXPECT_EQ("frame,sequence,time_ns,row,c0,c1,c2,c3,c4,c5,c6,c7,c8", csv[0]);
    const std::string bytes = recordings.frames({1});
    const std::vector<int16_t> image = frames::readFrameContent(bytes.data()).image;
    std::string line = "1,1,5004000000,15";
    for (size_t column = 0; column < 9; ++column) {
        line += "," + std::to_string(image[15 * 9 + column]);
    }
    EXPECT_EQ(line, csv[32]);
}

TEST_F(FramesExport, WritesEachFrameAsALineOfJson) {
    const std::vector<std::string> json = lines("json", {"--first", "2", "--last", "2"});
    ASSERT_EQ(1u, json.size());
    const std::string start =
            "{\"frame\":2,\"sequence\":2,\"time_ns\":5008000000,\"filter\":3,\"columns\":9,"
            "\"rows\":16,\"fingers\":[{\"finger\":0,\"x\":";
    EXPECT_EQ(start, json[0].substr(0, start.size()));
    EXPECT_EQ(9 * 16 - 1, std::count(json[0].begin() + static_cast<long>(json[0].find("image")),
                                     json[0].end(), ','));
}

TEST_F(FramesExport, TakesTheFramesAskedFor) {
    const struct {
        std::vector<std::string> words;
        std::vector<int> frames;
    } rows[] = {
            {{"--every", "3"}, {0, 3, 6}},
            {{"--first", "5"}, {5, 6}},
            {{"--last", "1"}, {0, 1}},
            {{"--first", "1", "--last", "5", "--every", "2"}, {1, 3, 5}},
            {{"--last", "1000"}, {0, 1, 2, 3, 4, 5, 6}},
    };
    for (const auto& row : rows) {
        const std::vector<std::string> json = lines("json", row.words);
        ASSERT_EQ(row.frames.size(), json.size()) << row.words[0];
        for (size_t i = 0; i < json.size(); ++i) {
            EXPECT_EQ(0u, json[i].find("{\"frame\":" + std::to_string(row.frames[i]) + ","));
        }
    }
}

TEST_F(FramesExport, WritesToAFile) {
    const std::string file = recordings.write("fingers.csv", "what was there before");
    EXPECT_EQ((std::vector<std::string>{"7 frames in " + file}), lines("csv", {"--output", file}));
    EXPECT_EQ(15u, splitLines(recordings.read("fingers.csv")).size());
    EXPECT_EQ((std::vector<std::string>{"{\"frames\":2,\"file\":\"" + file + "\"}"}),
              lines("csv", {"--output", file, "--last", "1", "--json"}));
    EXPECT_EQ(5u, splitLines(recordings.read("fingers.csv")).size());
    // Data on the standard output stands there alone.
    EXPECT_EQ(15u, lines("csv", {"--output", "-", "--json"}).size());
}

TEST_F(FramesExport, DoesNotWriteToTheRecording) {
    const std::string before = recordings.read("frames");
    ASSERT_EQ(0, symlink(path.c_str(), recordings.path("link").c_str()));
    ASSERT_EQ(0, mkdir(recordings.path("folder").c_str(), 0700));
    ASSERT_EQ(0, link(path.c_str(), recordings.path("folder/frame-000002.png").c_str()));
    const struct {
        std::vector<std::string> words;
        std::string output;
    } rows[] = {
            {{"export", path, "-f", "csv", "-o", path}, path},
            {{"export", path, "-f", "json", "-o", recordings.path("link")},
             recordings.path("link")},
            {{"export", recordings.path("link"), "-f", "cells", "-o", path}, path},
            {{"export", path, "-f", "png", "-o", recordings.path("folder"), "--first", "2"},
             recordings.path("folder/frame-000002.png")},
            {{"report", path, "-o", recordings.path("link")}, recordings.path("link")},
    };
    for (const auto& row : rows) {
        const RunResult result = framesCommand(row.words);
        EXPECT_EQ(1, result.status);
        EXPECT_EQ("", result.output);
        EXPECT_EQ("zelkctl: cannot write " + row.output + ": it is the file that is read\n",
                  result.errors);
        EXPECT_EQ(before, recordings.read("frames"));
    }
    const RunResult appended = run({"bash", "-c", R"("$0" frames export "$1" -f csv >>"$1")",
                                    ZELK_BIN_DIR "/zelkctl", path});
    EXPECT_EQ(1, appended.status);
    EXPECT_EQ("zelkctl: cannot write the standard output: it is the file that is read\n",
              appended.errors);
    EXPECT_EQ(before, recordings.read("frames"));
}

TEST_F(FramesExport, AddsToTheStandardOutputByItsDescriptor) {
    const std::string file = recordings.path("fingers.csv");
    for (const char* output : {"/dev/stdout", "/dev/fd/1", "/proc/self/fd/1", "/dev/fd/3"}) {
        recordings.write("fingers.csv", "before\n");
        const RunResult result = run(
                {"bash", "-c",
                 R"({ "$0" frames export "$1" -f csv --last 0 -o "$2" 3>&1; echo after; } >>"$3")",
                 ZELK_BIN_DIR "/zelkctl", path, output, file});
        EXPECT_EQ("", result.errors) << output;
        const std::vector<std::string> lines = splitLines(recordings.read("fingers.csv"));
        // What was exported is said where that is not the standard output by name.
        ASSERT_EQ(output == std::string("/dev/fd/3") ? 6u : 5u, lines.size()) << output;
        EXPECT_EQ("before", lines[0]);
        EXPECT_EQ("frame,sequence,time_ns,finger,x,y,peak", lines[1]);
        EXPECT_EQ("after", lines.back());
    }
    const RunResult page =
            run({"bash", "-c", R"({ echo before; "$0" frames report "$1" -o /dev/stdout; } >"$2")",
                 ZELK_BIN_DIR "/zelkctl", path, file});
    EXPECT_EQ("7 frames in /dev/stdout\n", page.errors);
    EXPECT_EQ(0u, recordings.read("fingers.csv").find("before\n<!DOCTYPE html>"));
}

TEST_F(FramesExport, TellsWhatItCannotWrite) {
    EXPECT_EQ("zelkctl: cannot write /dev/full: No space left on device\n",
              framesCommand({"export", path, "-f", "json", "-o", "/dev/full"}).errors);
    EXPECT_EQ("zelkctl: cannot open /no/such/file: No such file or directory\n",
              framesCommand({"export", path, "-f", "csv", "-o", "/no/such/file"}).errors);
    EXPECT_EQ("zelkctl: cannot make the folder /no/such/folder: No such file or directory\n",
              framesCommand({"export", path, "-f", "png", "-o", "/no/such/folder"}).errors);
}

TEST_F(FramesExport, LeavesAFileAloneWhenThereIsNothingGoodToWrite) {
    const std::string file = recordings.write("precious", "precious");
    const std::string foreign = recordings.write("foreign", "no frame at all");
    for (const std::string& recording : {foreign, recordings.path("none")}) {
        EXPECT_EQ(1, framesCommand({"export", recording, "-f", "csv", "-o", file}).status);
        EXPECT_EQ(1, framesCommand({"report", recording, "-o", file}).status);
    }
    EXPECT_EQ(1, framesCommand({"export", path, "-f", "csv", "-o", file, "--first", "7"}).status);
    EXPECT_EQ("precious", recordings.read("precious"));
}

TEST_F(FramesExport, TakesWhatIsIntactOfADamagedRecording) {
    std::string bytes = recordings.frames({0, 1, 2});
    bytes[RecordingToLookInto::kLength + 100] ^= 1;
    const std::string damaged = recordings.write("damaged", bytes);
    const RunResult result = framesCommand({"export", damaged, "-f", "csv"});
    EXPECT_EQ(1, result.status);
    EXPECT_EQ(5u, splitLines(result.output).size());
    EXPECT_EQ("zelkctl: " + damaged +
                      ": 1 corrupt, the first at offset 344; the intact frames are exported\n",
              result.errors);
}

TEST_F(FramesExport, RefusesWhatMakesNoSense) {
    const struct {
        std::vector<std::string> words;
        int status;
        std::string error;
    } rows[] = {
            {{"-f", "gif"},
             2,
             "zelkctl: --format: 'gif' is none of png|csv|cells|json (--help tells more)\n"},
            {{"-f", "jsno"},
             2,
             "zelkctl: --format: 'jsno' is none of png|csv|cells|json; did you mean 'json'? "
             "(--help tells more)\n"},
            {{}, 2, "zelkctl: --format is required (--help tells more)\n"},
            {{"-f", "png"}, 2, "zelkctl: --output: pictures need a folder (--help tells more)\n"},
            {{"-f", "csv", "--first", "5", "--last", "2"},
             2,
             "zelkctl: --first: 5 is behind --last, 2 (--help tells more)\n"},
            {{"-f", "csv", "--first", "7"},
             1,
             "zelkctl: " + path + " has 7 frames: there is no frame 7\n"},
    };
    for (const auto& row : rows) {
        std::vector<std::string> words = {"export", path};
        words.insert(words.end(), row.words.begin(), row.words.end());
        const RunResult result = framesCommand(words);
        EXPECT_EQ(row.status, result.status);
        EXPECT_EQ("", result.output);
        EXPECT_EQ(row.error, result.errors);
    }
}

}  // namespace pemaro::test
