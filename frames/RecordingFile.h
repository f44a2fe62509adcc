// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <android-base/unique_fd.h>

#include <cstddef>
#include <cstdint>
#include <functional>
#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "frames/Frame.h"
#include "frames/SpanChecksums.h"

namespace pemaro::frames {

/// A recording, opened for reading: a file of frames, one after another and nothing else.
///
///   recording = { frame }        a frame's own length tells where the next one begins
///
/// What is damaged is told apart from what is intact. Behind damage the next frame is looked for that is
/// intact from its magic to its checksum.
///
/// The file is read as it is needed, and may be larger than the memory; of what is no file, as a pipe,
/// everything is kept. Who changes the file meanwhile is noticed. One thread at a time.
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

    /// How much is taken of what is no file, and may have no end.
    static constexpr size_t kMaxStreamBytes = size_t{1} << 30;

    /// The longest frame that is handed out: 16 times the longest of the simulated stack. A longer one is
    /// told apart like any other, but what its header claims may be more than the memory.
    static constexpr size_t kMaxFrameBytes = size_t{16} << 20;

    /// Told now and then how many bytes were read of how many, which are 0 where that is not known;
    /// false gives up.
    using Progress = std::function<bool(uint64_t done, uint64_t total)>;

    /// Null, with a sentence about why, for a file that cannot be read or that does not begin as a
    /// recording does. An empty file is a recording without frames.
    static std::unique_ptr<RecordingFile> open(const std::string& path, std::string* problem,
                                               const Progress& progress = nullptr,
                                               size_t maxStreamBytes = kMaxStreamBytes);

    const std::string& path() const { return mPath; }
    uint64_t size() const { return mSize; }
    /// That of the open file, for whoever must not write to the same.
    int descriptor() const { return mFd.get(); }

    /// The whole file, from its beginning to its end.
    const std::vector<Part>& parts() const { return mParts; }
    /// Good until the next call. Null, with the reason in problem(), when the file no longer has
    /// them or they are more than kMaxFrameBytes; those of an intact frame are intact.
    const uint8_t* bytes(const Part& part) const;

    /// Why parts could not be read any more; empty as long as all could.
    const std::string& problem() const { return mProblem; }

  private:
    RecordingFile(const std::string& path, const Progress& progress)
            : mPath(path), mProgress(progress) {}

    bool load(size_t maxStreamBytes);
    bool loadStream(size_t maxBytes);
    void split();
    bool goesOn(uint64_t done, uint64_t total);
    Part partAt(uint64_t offset);
    uint64_t findIntact(uint64_t offset);
    bool isFrameAt(uint64_t offset, FrameHeader* header) const;
    bool beginsAt(uint64_t offset) const;
    const char* faultAt(uint64_t offset, const FrameHeader& header);
    bool addTo(uint32_t* crc, uint64_t begin, uint64_t end);
    bool isInWindow(uint64_t offset, uint64_t length) const;
    const uint8_t* at(uint64_t offset, uint64_t length) const;
    const uint8_t* aside(uint64_t offset, uint64_t length, uint8_t* room) const;
    size_t readAt(uint64_t offset, uint64_t least, uint8_t* bytes, size_t size) const;
    bool fail(const std::string& reason) const;

    const std::string mPath;
    android::base::unique_fd mFd;
    uint64_t mSize = 0;
    std::vector<Part> mParts;

    /// While it is opened.
    Progress mProgress;
    uint64_t mDone = 0;
    std::optional<SpanChecksums> mChecksums;

    /// What was read last of the file, and where it stands there; all of what is no file.
    mutable std::vector<uint8_t> mWindow;
    mutable uint64_t mWindowOffset = 0;
    mutable std::string mProblem;
};

}  // namespace pemaro::frames
