// SPDX-License-Identifier: Apache-2.0
#include "frames/RecordingFile.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <cstring>

namespace pemaro::frames {
namespace {

/// How much is read of the file at once, and how far a look for the next frame goes at once.
constexpr uint64_t kWindowBytes = 1 << 20;
constexpr uint64_t kSearchBytes = 1 << 16;

constexpr const char* kChanged = "it was changed meanwhile";
constexpr const char* kGivenUp = "that was given up";

/// Whether these bytes, of which there may be none, begin as a frame does.
bool beginsAsFrame(const uint8_t* bytes, size_t size) {
    return memcmp(bytes, &kFrameMagic, std::min(size, sizeof(kFrameMagic))) == 0;
}

}  // namespace

std::unique_ptr<RecordingFile> RecordingFile::open(const std::string& path, std::string* problem,
                                                   const Progress& progress,
                                                   size_t maxStreamBytes) {
    std::unique_ptr<RecordingFile> file(new RecordingFile(path));
    if (file->load(maxStreamBytes, progress)) {
        file->split(progress);
    }
    if (!file->mProblem.empty()) {
        *problem = file->mProblem;
        return nullptr;
    }
    return file;
}

bool RecordingFile::load(size_t maxStreamBytes, const Progress& progress) {
    mFd.reset(::open(mPath.c_str(), O_RDONLY | O_CLOEXEC));
    struct stat info {};
    if (!mFd.ok() || fstat(mFd.get(), &info) != 0) {
        return fail(strerror(errno));
    }
    if (S_ISDIR(info.st_mode)) {
        return fail(strerror(EISDIR));
    }
    if (S_ISREG(info.st_mode) && info.st_size != 0) {
        mSize = static_cast<uint64_t>(info.st_size);
    } else if (!loadStream(maxStreamBytes, progress)) {
        return false;
    }
    if (mSize != 0 && !beginsAt(0) && mProblem.empty()) {
        mProblem = mPath + " is no recording of touch frames: it does not begin with one";
    }
    return mProblem.empty();
}

/// What is foreign is left as soon as its first bytes are there: it may go on for ever.
bool RecordingFile::loadStream(size_t maxBytes, const Progress& progress) {
    while (true) {
        mWindow.resize(mSize + kSearchBytes);
        const ssize_t got =
                TEMP_FAILURE_RETRY(read(mFd.get(), mWindow.data() + mSize, kSearchBytes));
        if (got < 0) {
            return fail(strerror(errno));
        }
        mSize += static_cast<uint64_t>(got);
        if (got == 0 || !beginsAsFrame(mWindow.data(), mSize)) {
            break;
        }
        if (mSize > maxBytes) {
            return fail("there is no end within " + std::to_string(maxBytes) + " bytes");
        }
        if (progress && !progress(mSize, 0)) {
            return fail(kGivenUp);
        }
    }
    mWindow.resize(mSize);
    return true;
}

const uint8_t* RecordingFile::bytes(const Part& part) const {
    const uint8_t* found = at(part.offset, part.length);
    if (found == nullptr || part.kind != Kind::kFrame) {
        return found;
    }
    if (memcmp(found, &part.header, sizeof(part.header)) != 0 ||
        frameFault(found, part.length) != nullptr) {
        fail(kChanged);
        return nullptr;
    }
    return found;
}

/// These bytes, until the next call. REQUIRES: the file had so many when it was opened.
const uint8_t* RecordingFile::at(uint64_t offset, uint64_t length) const {
    const bool isHere =
            offset >= mWindowOffset && offset + length <= mWindowOffset + mWindow.size();
    if (isHere) {
        return mWindow.data() + (offset - mWindowOffset);
    }
    mWindow.resize(std::min(std::max(length, kWindowBytes), mSize - offset));
    mWindowOffset = offset;
    size_t have = 0;
    ssize_t got = 1;
    while (have < mWindow.size() && got > 0) {
        got = TEMP_FAILURE_RETRY(pread(mFd.get(), mWindow.data() + have, mWindow.size() - have,
                                       static_cast<off_t>(offset + have)));
        have += static_cast<size_t>(std::max<ssize_t>(got, 0));
    }
    mWindow.resize(have);
    if (have < length) {
        fail(got < 0 ? strerror(errno) : kChanged);
        return nullptr;
    }
    return mWindow.data();
}

void RecordingFile::split(const Progress& progress) {
    for (uint64_t offset = 0; offset < mSize && mProblem.empty(); offset += mParts.back().length) {
        mParts.push_back(partAt(offset));
        if (progress && !progress(offset, mSize)) {
            fail(kGivenUp);
        }
    }
}

RecordingFile::Part RecordingFile::partAt(uint64_t offset) const {
    const uint64_t left = mSize - offset;
    Part part{Kind::kFrame, offset, 0, {}, nullptr};
    const bool hasHeader = isFrameAt(offset, &part.header);
    if (hasHeader && part.header.length >= sizeof(FrameHeader) && part.header.length <= left) {
        part.length = part.header.length;
        part.problem = faultAt(offset, part.header);
        if (part.problem == nullptr) {
            return part;
        }
        part.kind = Kind::kCorrupt;
        // Its length can be believed where the next frame, or the end, follows.
        if (beginsAt(offset + part.length)) {
            return part;
        }
    }
    part.length = findIntact(offset + 1) - offset;
    const bool isCutOff =
            hasHeader ? part.header.length > left : left < sizeof(FrameHeader) && beginsAt(offset);
    if (isCutOff && part.length == left) {
        part.kind = Kind::kTruncated;
        part.problem = "the file ends within this frame";
        return part;
    }
    part.kind = Kind::kCorrupt;
    part.problem = hasHeader ? "a length that leads to no other frame" : "no frame begins here";
    part.header = {};
    return part;
}

/// Where the next intact frame begins; the size of the file where there is none.
uint64_t RecordingFile::findIntact(uint64_t offset) const {
    FrameHeader header;
    while (mSize - offset >= sizeof(kFrameMagic)) {
        const uint64_t size = std::min(mSize - offset, kSearchBytes);
        const uint8_t* bytes = at(offset, size);
        if (bytes == nullptr) {
            break;
        }
        const void* found = memmem(bytes, size, &kFrameMagic, sizeof(kFrameMagic));
        if (found == nullptr) {
            // The next magic may begin here and end behind.
            offset += size - sizeof(kFrameMagic) + 1;
            continue;
        }
        offset += static_cast<uint64_t>(static_cast<const uint8_t*>(found) - bytes);
        if (isFrameAt(offset, &header) && header.length <= mSize - offset &&
            faultAt(offset, header) == nullptr) {
            return offset;
        }
        offset += 1;
    }
    return mSize;
}

bool RecordingFile::isFrameAt(uint64_t offset, FrameHeader* header) const {
    const uint64_t size = std::min<uint64_t>(mSize - offset, sizeof(*header));
    const uint8_t* bytes = at(offset, size);
    return bytes != nullptr && readFrameHeader(bytes, size, header);
}

/// Whether a frame may begin there, or the file ends.
bool RecordingFile::beginsAt(uint64_t offset) const {
    const uint64_t size = std::min<uint64_t>(mSize - offset, sizeof(kFrameMagic));
    if (size == 0) {
        return true;
    }
    const uint8_t* bytes = at(offset, size);
    return bytes != nullptr && beginsAsFrame(bytes, size);
}

/// What is wrong with the frame that has this header. What contradicts itself is not read for it.
const char* RecordingFile::faultAt(uint64_t offset, const FrameHeader& header) const {
    const char* fault = frameHeaderFault(header, header.length);
    if (fault != nullptr) {
        return fault;
    }
    const uint8_t* bytes = at(offset, header.length);
    return bytes == nullptr ? kChanged : frameFault(bytes, header.length);
}

bool RecordingFile::fail(const std::string& reason) const {
    mProblem = "cannot read " + mPath + ": " + reason;
    return false;
}

}  // namespace pemaro::frames
