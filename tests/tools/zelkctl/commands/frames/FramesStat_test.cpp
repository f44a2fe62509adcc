// SPDX-License-Identifier: Apache-2.0
// What "zelkctl frames stat" tells of recordings, whole and damaged.

#include <gtest/gtest.h>

#include <cstdint>
#include <string>
#include <vector>

#include "tests/tools/zelkctl/commands/frames/RecordingToLookInto.h"
#include "tools/zelkctl/files/FrameSummary.h"

namespace pemaro::test {

namespace {

class FramesStat : public ::testing::Test {
  protected:
    RecordingToLookInto recordings;
};

}  // namespace

TEST_F(FramesStat, TellsOfAWholeRecording) {
    const std::string path = recordings.write("whole", recordings.frames({0, 1, 2, 3, 4}));
    const RunResult stat = framesCommand({"stat", path});
    EXPECT_EQ(0, stat.status);
    EXPECT_EQ("", stat.errors);
    EXPECT_EQ("recording   " + path +
                      ", 1720 bytes\n"
                      "frames      5 of 344 bytes\n"
                      "image       9 columns, 16 rows\n"
                      "fingers     2\n"
                      "duration    0.016 s, 250.0 frames/s\n"
                      "intervals   4.000 ms on average; least 4.000, p50 4.000, p90 4.000, p99 "
                      "4.000, "
                      "most 4.000\n"
                      "lost        0 in 0 gaps\n"
                      "corrupt     0\n",
              stat.output);
}

TEST_F(FramesStat, TellsTheSameInJson) {
    const std::string path = recordings.write("whole", recordings.frames({0, 1, 2}));
    const RunResult stat = framesCommand({"stat", "--json", path});
    EXPECT_EQ(0, stat.status);
    EXPECT_EQ("{\"file\":\"" + path +
                      "\",\"bytes\":1032,\"frames\":3,\"lengths\":{\"min\":344,\"max\":344},"
                      "\"columns\":{\"min\":9,\"max\":9},\"rows\":{\"min\":16,\"max\":16},"
                      "\"fingers\":{\"min\":2,\"max\":2},\"seconds\":0.008,\"rate\":250.0,"
                      "\"intervals_ms\":{\"min\":4.0,\"mean\":4.0,\"p50\":4.0,\"p90\":4.0,\"p99\":"
                      "4.0,"
                      "\"max\":4.0},\"lost\":0,\"gaps\":[],\"corrupt\":[]}\n",
              stat.output);
}

TEST_F(FramesStat, TellsWhereFramesAreMissingAndCorrupt) {
    std::string bytes = recordings.frames({0, 1, 4, 5, 6, 2});
    bytes[4 * RecordingToLookInto::kLength + 100] ^= 1;
    bytes.resize(bytes.size() - 10);
    const std::string path = recordings.write("damaged", bytes);
    const RunResult stat = framesCommand({"stat", path});
    EXPECT_EQ(1, stat.status);
    EXPECT_EQ("zelkctl: " + path +
                      ": 1 corrupt, the first at offset 1376; truncated within the frame at offset "
                      "1720\n",
              stat.errors);
    EXPECT_NE(std::string::npos,
              stat.output.find("lost        2 in 1 gaps\n"
                               "  before frame 2, offset 688: 2 lost\n"
                               "corrupt     1\n"
                               "  offset 1376, 344 bytes: wrong checksum\n"
                               "truncated   offset 1720, 334 bytes: the file ends "
                               "within this frame\n"))
            << stat.output;

    const RunResult json = framesCommand({"stat", "--json", path});
    EXPECT_EQ(1, json.status);
    EXPECT_NE(std::string::npos,
              json.output.find("\"lost\":2,\"gaps\":[{\"frame\":2,\"offset\":688,\"lost\":2}],"
                               "\"corrupt\":[{\"offset\":1376,\"bytes\":344,\"problem\":\"wrong "
                               "checksum\"}],\"truncated\":{\"offset\":1720,\"bytes\":334,"
                               "\"problem\":\"the file ends within this frame\"}}\n"))
            << json.output;
}

TEST_F(FramesStat, TellsTheFirstTenOfManyGaps) {
    std::vector<uint32_t> numbers;
    for (uint32_t i = 0; i < 13; ++i) {
        numbers.push_back(2 * i + 1);
    }
    const RunResult stat =
            framesCommand({"stat", recordings.write("gaps", recordings.frames(numbers))});
    EXPECT_EQ(0, stat.status);
    EXPECT_NE(std::string::npos, stat.output.find("lost        13 in 13 gaps\n")) << stat.output;
    EXPECT_NE(std::string::npos, stat.output.find("  before frame 9, offset 3096: 1 lost\n"
                                                  "  and 3 more (--json tells all)\n"
                                                  "corrupt     0\n"))
            << stat.output;
    EXPECT_EQ(std::string::npos, stat.output.find("intervals")) << stat.output;
}

TEST_F(FramesStat, KnowsWhereTwoRecordingsMeet) {
    const std::string path = recordings.write("two", recordings.frames({0, 1, 0, 1}));
    const RunResult stat = framesCommand({"stat", path});
    EXPECT_EQ(0, stat.status);
    EXPECT_NE(std::string::npos,
              stat.output.find("lost        0 in 1 gaps\n"
                               "  before frame 2, offset 688: the numbers go back\n"))
            << stat.output;
}

TEST_F(FramesStat, CountsNoTimeThatGoesBack) {
    const struct {
        std::vector<uint32_t> numbers;
        const char* duration;
        const char* json;
    } rows[] = {
            {{5, 6, 7, 0, 1},
             "duration    0.012 s, 250.0 frames/s\n",
             "\"seconds\":0.012,\"rate\":250.0"},
            {{9, 0}, "duration    0.000 s, 0.0 frames/s\n", "\"seconds\":0.0,\"rate\":0.0"},
            {{4, 0, 1},
             "duration    0.004 s, 250.0 frames/s\n",
             "\"seconds\":0.004,\"rate\":250.0"},
    };
    for (const auto& row : rows) {
        const std::string path = recordings.write("back", recordings.frames(row.numbers));
        const std::string text = framesCommand({"stat", path}).output;
        EXPECT_NE(std::string::npos, text.find(row.duration)) << text;
        const std::string json = framesCommand({"stat", "--json", path}).output;
        EXPECT_NE(std::string::npos, json.find(row.json)) << json;
    }
}

TEST_F(FramesStat, TellsOfAnEmptyRecording) {
    const std::string path = recordings.write("empty", "");
    const RunResult stat = framesCommand({"stat", path});
    EXPECT_EQ(0, stat.status);
    EXPECT_EQ("recording   " + path +
                      ", 0 bytes\nframes      0\nlost        0 in 0 gaps\ncorrupt     0\n",
              stat.output);
    EXPECT_EQ("{\"file\":\"" + path +
                      "\",\"bytes\":0,\"frames\":0,\"lost\":0,\"gaps\":[],\"corrupt\":[]}\n",
              framesCommand({"stat", "--json", path}).output);
}

TEST_F(FramesStat, RefusesWhatIsNoRecording) {
    const std::string path = recordings.write("foreign", "#!/bin/sh\n");
    const RunResult foreign = framesCommand({"stat", path});
    EXPECT_EQ(1, foreign.status);
    EXPECT_EQ("", foreign.output);
    EXPECT_EQ("zelkctl: " + path + " is no recording of touch frames: it does not begin with one\n",
              foreign.errors);
    EXPECT_EQ("zelkctl: cannot read /no/such: No such file or directory\n",
              framesCommand({"stat", "/no/such"}).errors);
}

TEST(Spread, HasPercentilesThatOccur) {
    std::vector<double> values;
    for (int i = 100; i >= 1; --i) {
        values.push_back(i);
    }
    const auto spread = zelkctl::spreadOf(values);
    ASSERT_TRUE(spread);
    EXPECT_EQ(1, spread->least);
    EXPECT_EQ(50.5, spread->mean);
    EXPECT_EQ(50, spread->p50);
    EXPECT_EQ(90, spread->p90);
    EXPECT_EQ(99, spread->p99);
    EXPECT_EQ(100, spread->most);
    EXPECT_EQ(7, zelkctl::spreadOf({7})->p50);
    EXPECT_EQ(2, zelkctl::spreadOf({1, 2})->p90);
    EXPECT_FALSE(zelkctl::spreadOf({}));
}

}  // namespace pemaro::test
