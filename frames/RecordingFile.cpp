// SPDX-License-Identifier: Apache-2.0
#include "frames/RecordingFile.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <cstring>

#include "frames/Checksum.h"

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
    std::unique_ptr<RecordingFile> file(new RecordingFile(path, progress));
    if (file->load(maxStreamBytes)) {
        file->split();
    }
    file->mProgress = nullptr;
    file->mChecksums.reset();
    if (!file->mProblem.empty()) {
        *problem = file->mProblem;
        return nullptr;
    }
    return file;
}

bool RecordingFile::load(size_t maxStreamBytes) {
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
    } else if (!loadStream(maxStreamBytes)) {
        return false;
    }
    if (mSize != 0 && !beginsAt(0) && mProblem.empty()) {
        mProblem = mPath + " is no recording of touch frames: it does not begin with one";
    }
    return mProblem.empty();
}

/// What is foreign is left as soon as its first bytes are there: it may go on for ever.
bool RecordingFile::loadStream(size_t maxBytes) {
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
        if (!goesOn(mSize, 0)) {
            return false;
        }
    }
    mWindow.resize(mSize);
    return true;
}

const uint8_t* RecordingFile::bytes(const Part& part) const {
    if (part.length > kMaxFrameBytes) {
        fail("the frame at offset " + std::to_string(part.offset) + " has " +
             std::to_string(part.length) + " bytes, and " + std::to_string(kMaxFrameBytes) +
             " are the most");
        return nullptr;
    }
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

bool RecordingFile::isInWindow(uint64_t offset, uint64_t length) const {
    return offset >= mWindowOffset && offset + length <= mWindowOffset + mWindow.size();
}

/// These bytes, until the next call. REQUIRES: the file had so many when it was opened.
const uint8_t* RecordingFile::at(uint64_t offset, uint64_t length) const {
    if (!isInWindow(offset, length)) {
        mWindow.resize(std::min(std::max(length, kWindowBytes), mSize - offset));
        mWindowOffset = offset;
        mWindow.resize(readAt(offset, length, mWindow.data(), mWindow.size()));
        if (mWindow.size() < length) {
            return nullptr;
        }
    }
    return mWindow.data() + (offset - mWindowOffset);
}

/// The same for a look ahead, from where the window would have to come back: what is not in it is read
/// into `room`.
const uint8_t* RecordingFile::aside(uint64_t offset, uint64_t length, uint8_t* room) const {
    if (isInWindow(offset, length)) {
        return mWindow.data() + (offset - mWindowOffset);
    }
    return readAt(offset, length, room, length) < length ? nullptr : room;
}

/// How many bytes were read, all that the file has of them; with a problem where it has not even the least.
size_t RecordingFile::readAt(uint64_t offset, uint64_t least, uint8_t* bytes, size_t size) const {
    size_t have = 0;
    ssize_t got = 1;
    while (have < size && got > 0) {
        got = TEMP_FAILURE_RETRY(
                pread(mFd.get(), bytes + have, size - have, static_cast<off_t>(offset + have)));
        have += static_cast<size_t>(std::max<ssize_t>(got, 0));
    }
    if (have < least) {
        fail(got < 0 ? strerror(errno) : kChanged);
    }
    return have;
}

void RecordingFile::split() {
    mChecksums.emplace([this](uint64_t begin, uint64_t end, uint32_t* crc) {
        return addTo(crc, begin, end) && goesOn(end, mSize);
    });
    mDone = 0;
    uint64_t offset = 0;
    while (offset < mSize) {
        mParts.push_back(partAt(offset));
        if (!goesOn(offset, mSize)) {
            break;
        }
        offset += mParts.back().length;
    }
}

/// Whether there is a reason to: no problem, nor that somebody gives up.
bool RecordingFile::goesOn(uint64_t done, uint64_t total) {
    // A checksum reaches further than the look for the next frame that it is made for.
    mDone = std::max(mDone, done);
    if (mProblem.empty() && mProgress && !mProgress(mDone, total)) {
        fail(kGivenUp);
    }
    return mProblem.empty();
}

RecordingFile::Part RecordingFile::partAt(uint64_t offset) {
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
uint64_t RecordingFile::findIntact(uint64_t offset) {
    FrameHeader header;
    while (mSize - offset >= sizeof(kFrameMagic) && goesOn(offset, mSize)) {
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
    uint8_t room[sizeof(kFrameMagic)];
    const uint8_t* bytes = aside(offset, size, room);
    return bytes != nullptr && beginsAsFrame(bytes, size);
}

/// What is wrong with the frame that has this header. What contradicts itself is not read for it.
const char* RecordingFile::faultAt(uint64_t offset, const FrameHeader& header) {
    const char* fault = frameHeaderFault(header, header.length);
    if (fault != nullptr) {
        return fault;
    }
    // A short one is read at once. Long ones may overlap, each header within the frame of the one before.
    if (header.length <= SpanChecksums::kBlockBytes) {
        const uint8_t* bytes = at(offset, header.length);
        return bytes == nullptr ? kChanged : frameFault(bytes, header.length);
    }
    uint32_t checksum = frameChecksum(&header, sizeof(header));
    if (!mChecksums->add(offset + sizeof(header), offset + header.length, &checksum)) {
        return kChanged;
    }
    return checksum == header.checksum ? nullptr : kWrongChecksum;
}

/// Continues a CRC-32 by no more than a block of the file.
bool RecordingFile::addTo(uint32_t* crc, uint64_t begin, uint64_t end) {
    uint8_t room[SpanChecksums::kBlockBytes];
    const uint8_t* bytes = aside(begin, end - begin, room);
    if (bytes != nullptr) {
        *crc = crc32(bytes, end - begin, *crc);
    }
    return bytes != nullptr;
}

bool RecordingFile::fail(const std::string& reason) const {
    mProblem = "cannot read " + mPath + ": " + reason;
    return false;
}

}  // namespace pemaro::frames
