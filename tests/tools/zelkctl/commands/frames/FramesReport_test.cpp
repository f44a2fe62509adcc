// SPDX-License-Identifier: Apache-2.0
// The page that "zelkctl frames report" makes, taken apart as its script does.

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <zlib.h>

#include <algorithm>
#include <cstring>
#include <string>
#include <vector>

#include "frames/FrameContent.h"
#include "tests/tools/zelkctl/commands/frames/RecordingToLookInto.h"
#include "tools/zelkctl/terminal/Heat.h"

using testing::HasSubstr;
using testing::Not;

namespace pemaro::test {

namespace {

// What stands in the element with this id.
std::string element(const std::string& page, const std::string& id) {
    const size_t mark = page.find("id=\"" + id + "\">");
    EXPECT_NE(std::string::npos, mark) << id;
    const size_t start = page.find('>', mark) + 1;
    return page.substr(start, page.find("</script>", start) - start);
}

std::string decodeBase64(const std::string& text) {
    const std::string digits = "ABCDEFGHIJKLMNOPQRSTUVWXYZabcdefghijklmnopqrstuvwxyz0123456789+/";
    std::string bytes;
    uint32_t bits = 0;
    int count = 0;
    for (const char character : text) {
        if (character == '=') {
            break;
        }
        const size_t value = digits.find(character);
        EXPECT_NE(std::string::npos, value);
        bits = bits << 6 | static_cast<uint32_t>(value);
        count += 6;
        if (count >= 8) {
            count -= 8;
            bytes += static_cast<char>(bits >> count);
        }
    }
    return bytes;
}

std::string inflate(const std::string& packed) {
    std::string bytes(1 << 20, '\0');
    uLongf size = bytes.size();
    EXPECT_EQ(Z_OK, uncompress(reinterpret_cast<Bytef*>(&bytes[0]), &size,
                               reinterpret_cast<const Bytef*>(packed.data()), packed.size()));
    bytes.resize(size);
    return bytes;
}

template <typename Value>
Value at(const std::string& bytes, size_t offset) {
    Value value{};
    memcpy(&value, &bytes[offset], sizeof(value));
    return value;
}

class FramesReport : public ::testing::Test {
  protected:
    std::string report(const std::string& path, std::vector<std::string> more = {}) {
        more.insert(more.begin(), {"report", path, "-o", recordings.path("page.html")});
        const RunResult result = framesCommand(more);
        EXPECT_EQ(0, result.status) << result.errors;
        EXPECT_EQ("", result.errors);
        output = result.output;
        return recordings.read("page.html");
    }

    RecordingToLookInto recordings;
    std::string output;
};

}  // namespace

TEST_F(FramesReport, HasAllFramesInOnePage) {
    const std::string bytes = recordings.frames({0, 1, 4});
    const std::string page = report(recordings.write("frames", bytes));
    const std::string data = inflate(decodeBase64(element(page, "data")));
    constexpr size_t kFrame = 28 + 2 * 8 + 9 * 16;
    ASSERT_EQ(3 * kFrame, data.size());
    int full = 0;
    for (size_t i = 0; i < 3; ++i) {
        const auto image = frames::readFrameContent(&bytes[i * RecordingToLookInto::kLength]).image;
        full = std::max<int>(full, *std::max_element(image.begin(), image.end()));
    }
    const double seconds[] = {0, 0.004, 0.016};
    const uint32_t sequences[] = {0, 1, 4};
    const uint32_t lost[] = {0, 0, 2};
    for (uint32_t i = 0; i < 3; ++i) {
        const size_t start = i * kFrame;
        EXPECT_DOUBLE_EQ(seconds[i], at<double>(data, start));
        EXPECT_EQ(i, at<uint32_t>(data, start + 8));
        EXPECT_EQ(sequences[i], at<uint32_t>(data, start + 12));
        EXPECT_EQ(lost[i], at<uint32_t>(data, start + 16));
        EXPECT_EQ(9, at<uint16_t>(data, start + 20));
        EXPECT_EQ(16, at<uint16_t>(data, start + 22));
        EXPECT_EQ(2, at<uint16_t>(data, start + 24));
        const frames::FrameContent content =
                frames::readFrameContent(&bytes[i * RecordingToLookInto::kLength]);
        EXPECT_EQ(0, memcmp(content.fingers.data(), &data[start + 28], 16));
        for (size_t cell = 0; cell < content.image.size(); ++cell) {
            const auto level = static_cast<uint8_t>(data[start + 44 + cell]);
            EXPECT_EQ(zelkctl::heatLevel(content.image[cell], full), level) << cell;
        }
    }
    EXPECT_THAT(element(page, "about"), HasSubstr("\"frames\":3"));
    EXPECT_EQ('[', element(page, "palette")[0]);
}

TEST_F(FramesReport, TellsWhatIsInThePage) {
    const std::string path = recordings.write("frames", recordings.frames({0, 1, 2}));
    report(path);
    EXPECT_EQ("3 frames in " + recordings.path("page.html") + "\n", output);
    const std::string page = report(path, {"--every", "2", "--json"});
    EXPECT_EQ("{\"frames\":2,\"bytes\":" + std::to_string(page.size()) + ",\"file\":\"" +
                      recordings.path("page.html") + "\"}\n",
              output);
    // A page on the standard output stands there alone.
    const RunResult result = framesCommand({"report", path, "-o", "-", "--every", "2"});
    EXPECT_EQ(page, result.output);
    EXPECT_EQ("2 frames in -\n", result.errors);
}

TEST_F(FramesReport, NeedsNothingFromElsewhere) {
    const std::string page = report(recordings.write("frames", recordings.frames({0})));
    for (const char* reference : {"http:", "https:", "src=", "href=", "@import", "url(", "fetch(",
                                  "@SUMMARY@", "@PALETTE@", "@FRAMES@"}) {
        EXPECT_THAT(page, Not(HasSubstr(reference)));
    }
}

TEST_F(FramesReport, IsNotLedAstrayByTheNameOfTheFile) {
    const std::string path = recordings.write("<script>alert(1)<", recordings.frames({0}));
    const std::string page = report(path);
    EXPECT_THAT(page, Not(HasSubstr("<script>alert")));
    EXPECT_THAT(element(page, "about"), HasSubstr("\\u003Cscript>alert(1)\\u003C"));
}

TEST_F(FramesReport, TakesEverySoManyFrames) {
    const std::string page = report(recordings.write("frames", recordings.frames({0, 1, 2, 5, 6})),
                                    {"--every", "2"});
    const std::string data = inflate(decodeBase64(element(page, "data")));
    constexpr size_t kFrame = 28 + 2 * 8 + 9 * 16;
    ASSERT_EQ(3 * kFrame, data.size());
    EXPECT_EQ(4u, at<uint32_t>(data, 2 * kFrame + 8));
    // What was lost before a frame that is left out is told with the next.
    EXPECT_EQ(2u, at<uint32_t>(data, 2 * kFrame + 16));
}

TEST_F(FramesReport, RefusesWhatCannotBeShown) {
    const std::string empty = recordings.write("empty", "");
    const RunResult result = framesCommand({"report", empty, "-o", recordings.path("page.html")});
    EXPECT_EQ(1, result.status);
    EXPECT_EQ("zelkctl: " + empty + ": there are no frames to show\n", result.errors);
    EXPECT_EQ("", recordings.read("page.html"));
    EXPECT_EQ(2, framesCommand({"report", empty}).status);
}

TEST_F(FramesReport, ShowsWhatIsIntact) {
    std::string bytes = recordings.frames({0, 1});
    bytes.resize(bytes.size() - 1);
    const std::string cut = recordings.write("cut", bytes);
    const RunResult result = framesCommand({"report", cut, "-o", recordings.path("page.html")});
    EXPECT_EQ(1, result.status);
    EXPECT_EQ(
            "zelkctl: " + cut +
                    ": truncated within the frame at offset 344; the page has the intact frames\n",
            result.errors);
    EXPECT_NE("", recordings.read("page.html"));
}

}  // namespace pemaro::test
