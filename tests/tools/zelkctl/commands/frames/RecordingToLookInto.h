// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <unistd.h>

#include <cstdint>
#include <cstdlib>
#include <fstream>
#include <iterator>
#include <string>
#include <vector>

#include "frames/FrameGenerator.h"
#include "tests/support/ChildProcess.h"

namespace pemaro::test {

/// A folder with recordings for a test, of frames of 9 columns, 16 rows and two fingers.
class RecordingToLookInto {
  public:
    static constexpr size_t kLength = 344;

    RecordingToLookInto() { EXPECT_NE(nullptr, mkdtemp(&mFolder[0])); }
    ~RecordingToLookInto() { run({"rm", "-rf", mFolder}); }

    std::string path(const std::string& name) const { return mFolder + "/" + name; }

    std::string frame(uint32_t sequence, uint64_t timeNs,
                      uint32_t filter = frames::kFilterDefault) {
        const std::vector<uint8_t>& bytes = mGenerator.draw(sequence, timeNs, filter);
        return {bytes.begin(), bytes.end()};
    }

    /// Frames with these numbers, a frame of them each 4 ms.
    std::string frames(const std::vector<uint32_t>& numbers) {
        std::string bytes;
        for (const uint32_t number : numbers) {
            bytes += frame(number, 5000000000u + number * uint64_t{4000000});
        }
        return bytes;
    }

    /// Returns the path.
    std::string write(const std::string& name, const std::string& bytes) const {
        std::ofstream(path(name), std::ios::binary) << bytes;
        return path(name);
    }

    std::string read(const std::string& name) const {
        std::ifstream file(path(name), std::ios::binary);
        return {std::istreambuf_iterator<char>(file), {}};
    }

  private:
    std::string mFolder = "/tmp/recordings.XXXXXX";
    frames::FrameGenerator mGenerator{kLength, 2};
};

/// Runs zelkctl with "frames" and these words.
inline RunResult framesCommand(std::vector<std::string> words) {
    words.insert(words.begin(), {ZELK_BIN_DIR "/zelkctl", "frames"});
    return run(words);
}

}  // namespace pemaro::test
