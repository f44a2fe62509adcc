// SPDX-License-Identifier: Apache-2.0
// The page that "zelkctl frames report" makes, in a browser without a window, opened from the disk.

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <string>

#include "frames/FrameContent.h"
#include "tests/tools/zelkctl/commands/frames/RecordingToLookInto.h"
#include "tools/zelkctl/terminal/Heat.h"

using testing::HasSubstr;

namespace pemaro::test {

namespace {

class ReportPage : public ::testing::Test {
  protected:
    void SetUp() override {
        const std::string path = recordings.write("frames", recordings.frames({0, 1, 4, 5}));
        ASSERT_EQ(0, framesCommand({"report", path, "-o", recordings.path("page.html")}).status);
    }

    // The page as it is after this script ran in it, at the end of the address.
    std::string after(const std::string& script, const std::string& end = "") {
        std::string page = recordings.read("page.html");
        page.insert(page.rfind("</body>"),
                    "<script>setTimeout(() => {" + script + "}, 1000);</script>\n");
        const std::string path = recordings.write("scripted.html", page);
        const RunResult result =
                run({"chromium-headless-shell", "--no-sandbox", "--disable-gpu",
                     "--user-data-dir=" + recordings.path("browser"), "--window-size=1200,900",
                     "--virtual-time-budget=3000", "--dump-dom", "file://" + path + end});
        EXPECT_EQ(0, result.status) << "this test needs chromium-headless-shell: " << result.errors;
        return result.output;
    }

    // What the status line says after these keys.
    std::string statusAfter(const std::string& keys) {
        const std::string page =
                after("for (const key of [" + keys +
                      "]) document.dispatchEvent(new KeyboardEvent('keydown', {key: "
                      "key.replace('^', ''), "
                      "shiftKey: key[0] === '^'}));"
                      "document.title = document.getElementById('status').textContent;");
        const size_t start = page.find("<title>") + 7;
        return page.substr(start, page.find("</title>") - start);
    }

    RecordingToLookInto recordings;
};

}  // namespace

TEST_F(ReportPage, ShowsTheFirstFrameAndTheSummary) {
    const std::string page = after("");
    EXPECT_THAT(page, HasSubstr(">frame 0 (sequence 0) at 0.000 s<"));
    EXPECT_THAT(page, HasSubstr("<title>" + recordings.path("frames") + "</title>"));
    EXPECT_THAT(page, HasSubstr("<tr><td>frames</td><td>4</td></tr>"));
    EXPECT_THAT(page, HasSubstr("<tr><td>lost</td><td>2 in 1 gaps</td></tr>"));
    const std::string bytes = recordings.frames({0});
    const frames::FingerRecord finger = frames::readFrameContent(bytes.data()).fingers[1];
    EXPECT_THAT(page, HasSubstr("<tr><td>1</td><td>" + std::to_string(finger.x) + "</td><td>" +
                                std::to_string(finger.y) + "</td><td>" +
                                std::to_string(finger.peak) + "</td></tr>"));
}

TEST_F(ReportPage, OpensAtAFrame) {
    EXPECT_THAT(
            after("", "#frame=2"),
            HasSubstr(">frame 2 (sequence 4) at 0.016 s, 12.000 ms after the one before, 2 lost "
                      "before it<"));
}

TEST_F(ReportPage, FollowsTheKeys) {
    const struct {
        const char* keys;
        const char* status;
    } rows[] = {
            {"'ArrowRight', 'ArrowRight', 'ArrowLeft'", "frame 1 (sequence 1)"},
            {"'End'", "frame 3 (sequence 5)"},
            {"'^ArrowRight'", "frame 3 (sequence 5)"},
            {"'End', 'Home'", "frame 0 (sequence 0)"},
    };
    for (const auto& row : rows) {
        EXPECT_THAT(statusAfter(row.keys), HasSubstr(row.status)) << row.keys;
    }
}

TEST_F(ReportPage, PlaysToItsEnd) {
    // Without a window nothing is drawn, and no frame of an animation is asked for.
    EXPECT_THAT(after("window.requestAnimationFrame = call => setTimeout(call, 10);"
                      "document.getElementById('play').click();"),
                HasSubstr(">frame 3 (sequence 5) at 0.020 s, 4.000 ms after the one before<"));
}

TEST_F(ReportPage, DrawsTheHeatMap) {
    // The colours of some cells, away from fingers and their tracks.
    const std::string page =
            after("const map = document.getElementById('map');"
                  "const scale = map.width / 9;"
                  "const colors = [];"
                  "for (let row = 0; row < 16; ++row) for (let column = 0; column < 9; ++column)"
                  " colors.push(map.getContext('2d').getImageData((column + 0.1) * scale, "
                  "(row + 0.1) * scale, 1, 1).data.slice(0, 3).join(','));"
                  "document.title = colors.join(' ') + ' ';");
    int full = 1;
    std::vector<int16_t> image;
    for (const uint32_t number : {5, 4, 1, 0}) {
        const std::string bytes = recordings.frames({number});
        image = frames::readFrameContent(bytes.data()).image;
        full = std::max<int>(full, *std::max_element(image.begin(), image.end()));
    }
    size_t at = page.find("<title>") + 7;
    int same = 0;
    for (const int16_t cell : image) {
        const zelkctl::Color color = zelkctl::heatColor(zelkctl::heatLevel(cell, full));
        const std::string expected = std::to_string(color.red) + "," + std::to_string(color.green) +
                                     "," + std::to_string(color.blue);
        const size_t end = page.find(' ', at);
        same += page.substr(at, end - at) == expected ? 1 : 0;
        at = end + 1;
    }
    // Two crosses and their numbers lie over few of the 144 cells.
    EXPECT_GE(same, 130) << page.substr(page.find("<title>"), 2000);
}

}  // namespace pemaro::test
