// SPDX-License-Identifier: Apache-2.0
#include "frames/RecordingFile.h"

#include <android-base/file.h>
#include <android-base/unique_fd.h>
#include <fcntl.h>
#include <sys/mman.h>
#include <sys/stat.h>

#include <algorithm>
#include <cerrno>
#include <cstring>

namespace pemaro::frames {
namespace {

/// Whether these bytes, of which there may be none, begin as a frame does.
bool beginsAsFrame(const uint8_t* bytes, size_t size) {
    return memcmp(bytes, &kFrameMagic, std::min(size, sizeof(kFrameMagic))) == 0;
}

}  // namespace

std::unique_ptr<RecordingFile> RecordingFile::open(const std::string& path, std::string* problem) {
    std::unique_ptr<RecordingFile> file(new RecordingFile(path));
    if (!file->load(problem)) {
        return nullptr;
    }
    if (file->mSize != 0 && !beginsAsFrame(file->mBytes, file->mSize)) {
        *problem = path + " is no recording of touch frames: it does not begin with one";
        return nullptr;
    }
    file->split();
    return file;
}

bool RecordingFile::load(std::string* problem) {
    const auto fail = [this, problem](int reason) {
        *problem = "cannot read " + mPath + ": " + strerror(reason);
        return false;
    };
    const android::base::unique_fd fd(::open(mPath.c_str(), O_RDONLY | O_CLOEXEC));
    struct stat info {};
    if (!fd.ok() || fstat(fd.get(), &info) != 0) {
        return fail(errno);
    }
    if (S_ISDIR(info.st_mode)) {
        return fail(EISDIR);
    }
    if (S_ISREG(info.st_mode) && info.st_size != 0) {
        mSize = static_cast<uint64_t>(info.st_size);
        mMapping = android::base::MappedFile::FromFd(fd, 0, mSize, PROT_READ);
        if (mMapping == nullptr) {
            return fail(errno);
        }
        mBytes = reinterpret_cast<const uint8_t*>(mMapping->data());
        return true;
    }
    if (!android::base::ReadFdToString(fd, &mCopy)) {
        return fail(errno);
    }
    mBytes = reinterpret_cast<const uint8_t*>(mCopy.data());
    mSize = mCopy.size();
    return true;
}

void RecordingFile::split() {
    for (uint64_t offset = 0; offset < mSize; offset += mParts.back().length) {
        mParts.push_back(partAt(offset));
    }
}

RecordingFile::Part RecordingFile::partAt(uint64_t offset) const {
    const uint64_t left = mSize - offset;
    Part part{Kind::kFrame, offset, 0, {}, nullptr};
    const bool hasHeader = isFrameAt(offset, &part.header);
    if (hasHeader && part.header.length >= sizeof(FrameHeader) && part.header.length <= left) {
        part.length = part.header.length;
        part.problem = frameFault(mBytes + offset, part.length);
        if (part.problem == nullptr) {
            return part;
        }
        part.kind = Kind::kCorrupt;
        // Its length can be believed where the next frame, or the end, follows.
        if (beginsAsFrame(mBytes + offset + part.length, left - part.length)) {
            return part;
        }
    }
    part.length = findIntact(offset + 1) - offset;
    const bool isCutOff =
            hasHeader ? part.header.length > left
                      : left < sizeof(FrameHeader) && beginsAsFrame(mBytes + offset, left);
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
    for (; offset < mSize; ++offset) {
        const void* found =
                memmem(mBytes + offset, mSize - offset, &kFrameMagic, sizeof(kFrameMagic));
        if (found == nullptr) {
            break;
        }
        offset = static_cast<uint64_t>(static_cast<const uint8_t*>(found) - mBytes);
        if (isFrameAt(offset, &header) && header.length <= mSize - offset &&
            frameFault(mBytes + offset, header.length) == nullptr) {
            return offset;
        }
    }
    return mSize;
}

bool RecordingFile::isFrameAt(uint64_t offset, FrameHeader* header) const {
    return readFrameHeader(mBytes + offset, mSize - offset, header);
}

}  // namespace pemaro::frames
