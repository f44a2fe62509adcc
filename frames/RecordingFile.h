// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <android-base/mapped_file.h>

#include <cstddef>
#include <cstdint>
#include <memory>
#include <string>
#include <vector>

#include "frames/Frame.h"

namespace pemaro::frames {

/// A recording, opened for reading: a file of frames, one after another and nothing else.
///
///   recording = { frame }        a frame's own length tells where the next one begins
///
/// What is damaged is told apart from what is intact. Behind damage the next frame is looked for that is
/// intact from its magic to its checksum.
class RecordingFile {
  public:
    enum class Kind {
        kFrame,      ///< an intact frame
        kCorrupt,    ///< bytes that are none
        kTruncated,  ///< the last one, which the file ends within
    };

    struct Part {
        Kind kind;
        uint64_t offset;  ///< in the file
        size_t length;    ///< bytes that are there
        /// Of an intact frame, and else what of it can be believed: a corrupt frame whose end is known
        /// has its length at least.
        FrameHeader header;
        const char* problem;  ///< null for an intact frame
    };

    /// Null, with a sentence about why, for a file that cannot be read or that does not begin as a
    /// recording does. An empty file is a recording without frames.
    /// The file must not become shorter as long as the object lives.
    static std::unique_ptr<RecordingFile> open(const std::string& path, std::string* problem);

    const std::string& path() const { return mPath; }
    uint64_t size() const { return mSize; }

    /// The whole file, from its beginning to its end.
    const std::vector<Part>& parts() const { return mParts; }
    const uint8_t* bytes(const Part& part) const { return mBytes + part.offset; }

  private:
    explicit RecordingFile(const std::string& path) : mPath(path) {}

    bool load(std::string* problem);
    void split();
    Part partAt(uint64_t offset) const;
    uint64_t findIntact(uint64_t offset) const;
    bool isFrameAt(uint64_t offset, FrameHeader* header) const;

    const std::string mPath;
    std::unique_ptr<android::base::MappedFile> mMapping;
    std::string mCopy;  ///< of what cannot be mapped
    const uint8_t* mBytes = nullptr;
    uint64_t mSize = 0;
    std::vector<Part> mParts;
};

}  // namespace pemaro::frames
