// SPDX-License-Identifier: Apache-2.0
#include "frames/RecordingFile.h"

#include <gtest/gtest.h>
#include <signal.h>
#include <sys/resource.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <cstring>
#include <fstream>
#include <random>
#include <string>
#include <thread>
#include <utility>
#include <vector>

#include "frames/Checksum.h"
#include "frames/FrameGenerator.h"

namespace pemaro::frames {

namespace {

constexpr size_t kLength = 128;  // of a frame of 4 columns and 9 rows, with two fingers

using Kind = RecordingFile::Kind;

struct Expected {
    Kind kind;
    uint64_t offset;
    size_t length;
    const char* problem;
};

/// The parts of a recording, found in the plainest way.
std::vector<Expected> partsOf(const std::string& bytes) {
    const auto isIntact = [&bytes](size_t offset, const FrameHeader& header) {
        return header.length <= bytes.size() - offset &&
               frameFault(&bytes[offset], header.length) == nullptr;
    };
    const auto headerAt = [&bytes](size_t offset, FrameHeader* header) {
        return readFrameHeader(&bytes[offset], bytes.size() - offset, header);
    };
    std::vector<Expected> parts;
    for (size_t offset = 0; offset < bytes.size(); offset += parts.back().length) {
        const size_t left = bytes.size() - offset;
        FrameHeader header{};
        const bool hasHeader = headerAt(offset, &header);
        if (hasHeader && header.length >= sizeof(header) && header.length <= left) {
            const char* fault = frameFault(&bytes[offset], header.length);
            const size_t behind = std::min(left - header.length, sizeof(kFrameMagic));
            if (fault == nullptr ||
                memcmp(&bytes[offset] + header.length, &kFrameMagic, behind) == 0) {
                const Kind kind = fault == nullptr ? Kind::kFrame : Kind::kCorrupt;
                parts.push_back({kind, offset, header.length, fault});
                continue;
            }
        }
        size_t next = offset + 1;
        FrameHeader other{};
        while (next < bytes.size() && !(headerAt(next, &other) && isIntact(next, other))) {
            next += 1;
        }
        const bool isMagic =
                memcmp(&bytes[offset], &kFrameMagic, std::min(left, sizeof(kFrameMagic))) == 0;
        const bool isCut = hasHeader ? header.length > left : left < sizeof(header) && isMagic;
        if (isCut && next == bytes.size()) {
            parts.push_back({Kind::kTruncated, offset, left, "the file ends within this frame"});
        } else {
            parts.push_back(
                    {Kind::kCorrupt, offset, next - offset,
                     hasHeader ? "a length that leads to no other frame" : "no frame begins here"});
        }
    }
    return parts;
}

/// A header that does not contradict itself, of a frame without fingers whose checksum is another one.
FrameHeader headerOf(uint16_t columns, uint16_t rows) {
    FrameHeader header{};
    header.magic = kFrameMagic;
    header.version = kFrameVersion;
    header.headerBytes = sizeof(header);
    header.filter = kFilterImage;
    header.columns = columns;
    header.rows = rows;
    header.length = static_cast<uint32_t>(sizeof(header) + sizeof(int16_t) * columns * rows);
    return header;
}

std::string bytesOf(const FrameHeader& header) {
    return {reinterpret_cast<const char*>(&header), sizeof(header)};
}

/// The checksum of the frame with this header and nothing but zeros.
uint32_t checksumOfNothing(const FrameHeader& header) {
    const std::string zeros(1 << 20, '\0');
    uint32_t crc = frameChecksum(&header, sizeof(header));
    for (size_t left = header.length - sizeof(header); left > 0;) {
        const size_t size = std::min(left, zeros.size());
        crc = crc32(zeros.data(), size, crc);
        left -= size;
    }
    return crc;
}

/// A file of which one half are headers, each of a frame that is as long as the other half.
std::string headersUpTo(size_t size) {
    const auto rows = static_cast<uint16_t>(size / 2 / 1024);
    std::string bytes;
    while (bytes.size() < size / 2) {
        bytes += bytesOf(headerOf(512, rows));
    }
    bytes.resize(size, 'x');
    return bytes;
}

/// The most memory that this process had, in bytes.
size_t mostMemory() {
    rusage usage{};
    EXPECT_EQ(0, getrusage(RUSAGE_SELF, &usage));
    return static_cast<size_t>(usage.ru_maxrss) << 10;
}

class RecordingFileTest : public ::testing::Test {
  protected:
    ~RecordingFileTest() override { unlink(path.c_str()); }

    std::string frame(uint32_t sequence) {
        const std::vector<uint8_t>& bytes = generator.draw(sequence, 0, kFilterDefault);
        EXPECT_EQ(kLength, bytes.size());
        return {bytes.begin(), bytes.end()};
    }

    std::string framesTo(uint32_t count) {
        std::string bytes;
        for (uint32_t i = 0; i < count; ++i) {
            bytes += frame(i);
        }
        return bytes;
    }

    std::unique_ptr<RecordingFile> write(const std::string& bytes) {
        std::ofstream(path, std::ios::binary) << bytes;
        return RecordingFile::open(path, &problem);
    }

    /// A frame of nothing but zeros, which take no room on the disk.
    std::unique_ptr<RecordingFile> writeSparse(const FrameHeader& header) {
        std::ofstream(path, std::ios::binary) << bytesOf(header);
        EXPECT_EQ(0, truncate(path.c_str(), header.length));
        return RecordingFile::open(path, &problem);
    }

    void expectParts(const std::string& bytes, const std::vector<Expected>& expected) {
        const auto file = write(bytes);
        ASSERT_NE(nullptr, file) << problem;
        ASSERT_EQ(expected.size(), file->parts().size());
        for (size_t i = 0; i < expected.size(); ++i) {
            const RecordingFile::Part& part = file->parts()[i];
            EXPECT_EQ(expected[i].kind, part.kind) << i;
            EXPECT_EQ(expected[i].offset, part.offset) << i;
            EXPECT_EQ(expected[i].length, part.length) << i;
            EXPECT_STREQ(expected[i].problem, part.problem) << i;
        }
    }

    const std::string path = testing::TempDir() + "RecordingFile_test." + std::to_string(getpid());
    std::string problem;
    FrameGenerator generator{128, 2};
};

}  // namespace

TEST_F(RecordingFileTest, HasTheFramesThatWereWritten) {
    const std::string bytes = framesTo(5);
    const auto file = write(bytes);
    ASSERT_NE(nullptr, file) << problem;
    EXPECT_EQ(path, file->path());
    EXPECT_EQ(bytes.size(), file->size());
    ASSERT_EQ(5u, file->parts().size());
    for (uint32_t i = 0; i < 5; ++i) {
        const RecordingFile::Part& part = file->parts()[i];
        EXPECT_EQ(Kind::kFrame, part.kind);
        EXPECT_EQ(i, part.header.sequence);
        EXPECT_EQ(frame(i), std::string(file->bytes(part), file->bytes(part) + part.length));
    }
}

TEST_F(RecordingFileTest, WithoutFramesIsEmpty) {
    expectParts("", {});
}

TEST_F(RecordingFileTest, NamesAForeignFile) {
    for (const char* bytes : {"x",
                              "\x7f"
                              "ELF and so on",
                              "a long text that is no recording at all"}) {
        EXPECT_EQ(nullptr, write(bytes));
        EXPECT_EQ(path + " is no recording of touch frames: it does not begin with one", problem);
    }
}

TEST_F(RecordingFileTest, TellsWhyItCannotBeRead) {
    EXPECT_EQ(nullptr, RecordingFile::open("/no/such/file", &problem));
    EXPECT_EQ("cannot read /no/such/file: No such file or directory", problem);
    EXPECT_EQ(nullptr, RecordingFile::open("/", &problem));
    EXPECT_EQ("cannot read /: Is a directory", problem);
}

TEST_F(RecordingFileTest, EndsWithinAFrameWhereverItIsCut) {
    const std::string bytes = framesTo(2);
    for (const size_t left :
         {size_t{1}, size_t{3}, size_t{12}, size_t{39}, size_t{40}, kLength - 1}) {
        expectParts(bytes.substr(0, kLength + left),
                    {{Kind::kFrame, 0, kLength, nullptr},
                     {Kind::kTruncated, kLength, left, "the file ends within this frame"}});
    }
}

TEST_F(RecordingFileTest, KeepsToTheLengthOfAFrameWithAWrongChecksum) {
    std::string bytes = framesTo(4);
    bytes[kLength + 60] ^= 1;
    bytes[2 * kLength + 60] ^= 1;
    expectParts(bytes, {{Kind::kFrame, 0, kLength, nullptr},
                        {Kind::kCorrupt, kLength, kLength, "wrong checksum"},
                        {Kind::kCorrupt, 2 * kLength, kLength, "wrong checksum"},
                        {Kind::kFrame, 3 * kLength, kLength, nullptr}});
}

TEST_F(RecordingFileTest, FindsTheNextFrameBehindDamage) {
    const std::string bytes = framesTo(3);
    const struct {
        size_t at;
        char value;
        const char* problem;
    } rows[] = {
            {0, 'z', "no frame begins here"},                    // the magic
            {4, 9, "no frame begins here"},                      // the version
            {8, 77, "a length that leads to no other frame"},    // a shorter length
            {8, 0, "a length that leads to no other frame"},     // none
            {11, 127, "a length that leads to no other frame"},  // far beyond the end
    };
    for (const auto& row : rows) {
        std::string damaged = bytes;
        damaged[kLength + row.at] = row.value;
        expectParts(damaged, {{Kind::kFrame, 0, kLength, nullptr},
                              {Kind::kCorrupt, kLength, kLength, row.problem},
                              {Kind::kFrame, 2 * kLength, kLength, nullptr}});
    }
}

TEST_F(RecordingFileTest, TellsOfBytesBehindTheLastFrame) {
    expectParts(frame(0) + std::string(300, '\0'),
                {{Kind::kFrame, 0, kLength, nullptr},
                 {Kind::kCorrupt, kLength, 300, "no frame begins here"}});
}

TEST_F(RecordingFileTest, DoesNotTakeAMagicWithinAFrameForOne) {
    std::string bytes = frame(0) + frame(1) + frame(2);
    bytes.replace(kLength + 50, 4, "ZTFR");
    bytes[kLength] = 'z';
    expectParts(bytes, {{Kind::kFrame, 0, kLength, nullptr},
                        {Kind::kCorrupt, kLength, kLength, "no frame begins here"},
                        {Kind::kFrame, 2 * kLength, kLength, nullptr}});
}

TEST_F(RecordingFileTest, TellsHowFarItIsAndIsGivenUp) {
    write(framesTo(3));
    std::vector<std::pair<uint64_t, uint64_t>> told;
    const auto tell = [&told](uint64_t done, uint64_t total) {
        told.emplace_back(done, total);
        return told.size() < 3;
    };
    EXPECT_EQ(nullptr, RecordingFile::open(path, &problem, tell));
    EXPECT_EQ("cannot read " + path + ": that was given up", problem);
    EXPECT_EQ((std::vector<std::pair<uint64_t, uint64_t>>{
                      {0, 3 * kLength}, {kLength, 3 * kLength}, {2 * kLength, 3 * kLength}}),
              told);
}

TEST_F(RecordingFileTest, CanBeReadFromAPipe) {
    ASSERT_EQ(0, mkfifo(path.c_str(), 0600));
    std::thread writer([this] { std::ofstream(path, std::ios::binary) << framesTo(3); });
    uint64_t last = 0;
    const auto file = RecordingFile::open(path, &problem, [&last](uint64_t done, uint64_t total) {
        last = total == 0 ? done : last;
        return true;
    });
    writer.join();
    ASSERT_NE(nullptr, file) << problem;
    EXPECT_EQ(3u, file->parts().size());
    EXPECT_EQ(3 * kLength, last);
}

TEST_F(RecordingFileTest, IsRefusedAtOnceWhenItIsForeignAndEndless) {
    EXPECT_EQ(nullptr, RecordingFile::open("/dev/zero", &problem));
    EXPECT_EQ("/dev/zero is no recording of touch frames: it does not begin with one", problem);
}

TEST_F(RecordingFileTest, IsRefusedWhenAPipeHasNoEnd) {
    // The writer may be left alone within a frame.
    signal(SIGPIPE, SIG_IGN);
    ASSERT_EQ(0, mkfifo(path.c_str(), 0600));
    std::thread writer([this] { std::ofstream(path, std::ios::binary) << framesTo(800); });
    EXPECT_EQ(nullptr, RecordingFile::open(path, &problem, nullptr, 700 * kLength));
    writer.join();
    EXPECT_EQ("cannot read " + path + ": there is no end within 89600 bytes", problem);
}

// Frames of all lengths, some within others and some damaged, with anything between them.
TEST_F(RecordingFileTest, HasThePartsThatAPlainSearchFinds) {
    std::mt19937 random(1);
    const auto upTo = [&random](size_t limit) {
        return std::uniform_int_distribution<size_t>(0, limit)(random);
    };
    for (int round = 0; round < 300; ++round) {
        std::string bytes = frame(0);
        for (size_t left = upTo(8); left > 0; --left) {
            FrameGenerator other(static_cast<uint32_t>(40 + upTo(upTo(1) == 0 ? 300 : 20000)), 1);
            const std::vector<uint8_t>& drawn = other.draw(1, left, kFilterDefault);
            std::string piece(drawn.begin(), drawn.end());
            switch (upTo(6)) {
                case 0:
                    piece[upTo(piece.size() - 1)] ^= 4;
                    break;
                case 1:
                    piece.resize(upTo(piece.size()));
                    break;
                case 2:
                    piece += std::string(upTo(5000), 'x');
                    break;
                case 3:
                    piece.insert(upTo(piece.size()), frame(1));
                    break;
                case 4:
                    // A frame that these headers claim to be within, one in the other.
                    piece = headersUpTo(4096 + upTo(8192)) + piece;
                    break;
                default:
                    break;
            }
            bytes += piece;
        }
        expectParts(bytes, partsOf(bytes));
        ASSERT_FALSE(HasFailure()) << round;
    }
}

// Each of the headers needs a checksum of its own, of all that it claims to be its frame's.
TEST_F(RecordingFileTest, WorksNoMoreThanTwiceForTwiceAsManyHeadersThatClaimMuch) {
    uint64_t asked[2] = {0, 0};
    for (size_t i = 0; i < 2; ++i) {
        const size_t size = size_t{1} << (18 + i);
        write(frame(0) + headersUpTo(size));
        const auto file = RecordingFile::open(path, &problem, [&](uint64_t done, uint64_t total) {
            EXPECT_LE(done, total);
            asked[i] += 1;
            return true;
        });
        ASSERT_NE(nullptr, file) << problem;
        EXPECT_EQ(2u, file->parts().size());
        // For every header at least.
        EXPECT_GT(asked[i], size / 2 / sizeof(FrameHeader));
    }
    EXPECT_LE(asked[1], asked[0] * 2 + asked[0] / 10);
}

TEST_F(RecordingFileTest, IsGivenUpAmidDamageAndAmidAFrame) {
    const std::string long1 = bytesOf(headerOf(1024, 1024)) + std::string(2 << 20, '\0');
    for (const std::string& bytes :
         {headersUpTo(1 << 18), frame(0) + std::string(1 << 20, 'x'), frame(0) + long1}) {
        write(bytes);
        int asked = 0;
        EXPECT_EQ(nullptr, RecordingFile::open(path, &problem,
                                               [&](uint64_t, uint64_t) { return ++asked < 5; }));
        EXPECT_EQ("cannot read " + path + ": that was given up", problem);
        EXPECT_EQ(5, asked);
    }
}

TEST_F(RecordingFileTest, TakesNoMemoryForWhatAHeaderClaims) {
    FrameHeader header = headerOf(8192, 8192);
    header.checksum = checksumOfNothing(header);
    const size_t before = mostMemory();
    for (const bool isIntact : {true, false}) {
        header.checksum ^= isIntact ? 0 : 1;
        const auto file = writeSparse(header);
        ASSERT_NE(nullptr, file) << problem;
        ASSERT_EQ(1u, file->parts().size());
        EXPECT_EQ(isIntact ? Kind::kFrame : Kind::kCorrupt, file->parts()[0].kind);
        EXPECT_EQ(nullptr, file->bytes(file->parts()[0]));
        EXPECT_EQ("cannot read " + path +
                          ": the frame at offset 0 has 134217768 bytes, and 16777216 are the most",
                  file->problem());
    }
    EXPECT_LT(mostMemory() - before, size_t{64} << 20);
}

TEST_F(RecordingFileTest, GivesOutTheLongestFrameAndNoLongerOne) {
    FrameHeader header = headerOf(2048, 4095);
    header.fingers = 507;
    header.length += header.fingers * sizeof(FingerRecord);
    ASSERT_EQ(RecordingFile::kMaxFrameBytes, header.length);
    for (const bool isLonger : {false, true}) {
        header.fingers += isLonger ? 1 : 0;
        header.length += isLonger ? sizeof(FingerRecord) : 0;
        header.checksum = checksumOfNothing(header);
        const auto file = writeSparse(header);
        ASSERT_NE(nullptr, file) << problem;
        ASSERT_EQ(1u, file->parts().size());
        EXPECT_EQ(Kind::kFrame, file->parts()[0].kind);
        EXPECT_EQ(isLonger, file->bytes(file->parts()[0]) == nullptr);
    }
}

// Longer than what is read at once, and damaged where that ends.
TEST_F(RecordingFileTest, MayBeLongerThanWhatIsReadAtOnce) {
    constexpr uint32_t kFrames = 20000;
    constexpr uint64_t kDamage = (uint64_t{1} << 20) - 64;
    std::string bytes = framesTo(kFrames);
    bytes.replace(kDamage, 200000, std::string(200000, '\0'));
    const auto file = write(bytes);
    ASSERT_NE(nullptr, file) << problem;
    uint64_t end = 0;
    uint64_t intact = 0;
    for (const RecordingFile::Part& part : file->parts()) {
        EXPECT_EQ(end, part.offset);
        end += part.length;
        if (part.kind == Kind::kFrame) {
            EXPECT_EQ(part.offset / kLength, part.header.sequence);
            ASSERT_NE(nullptr, file->bytes(part));
            EXPECT_EQ(0, memcmp(bytes.data() + part.offset, file->bytes(part), part.length));
            intact += 1;
        }
    }
    EXPECT_EQ(bytes.size(), end);
    // 8191 whole frames and half of one before the damage; it ends within another one.
    EXPECT_EQ(8191u + (kFrames - 9754), intact);
}

TEST_F(RecordingFileTest, TellsWhenItBecameShorterMeanwhile) {
    const auto file = write(framesTo(20000));
    ASSERT_NE(nullptr, file) << problem;
    ASSERT_NE(nullptr, file->bytes(file->parts()[9000]));
    ASSERT_EQ(0, truncate(path.c_str(), 10 * kLength));
    EXPECT_EQ(nullptr, file->bytes(file->parts()[15]));
    EXPECT_EQ("cannot read " + path + ": it was changed meanwhile", file->problem());
    EXPECT_NE(nullptr, file->bytes(file->parts()[5]));
}

TEST_F(RecordingFileTest, GivesOutNoFrameThatAnotherTookThePlaceOf) {
    const auto file = write(framesTo(20000));
    ASSERT_NE(nullptr, file) << problem;
    std::ofstream(path, std::ios::binary) << frame(7) << frame(1) << std::string(kLength, 'x');
    EXPECT_EQ(nullptr, file->bytes(file->parts()[0]));
    EXPECT_EQ("cannot read " + path + ": it was changed meanwhile", file->problem());
    EXPECT_NE(nullptr, file->bytes(file->parts()[1]));
    EXPECT_EQ(nullptr, file->bytes(file->parts()[2]));
}

}  // namespace pemaro::frames
