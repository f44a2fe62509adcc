// SPDX-License-Identifier: Apache-2.0

// What zelkctl reads from files and services and takes apart: recordings, frames, files of gestures and
// configurations, and the records of events.

#include <fuzzer/FuzzedDataProvider.h>

#include <cstdint>
#include <cstring>
#include <string>
#include <vector>

#include "frames/FrameContent.h"
#include "frames/FrameGenerator.h"
#include "frames/RecordingFile.h"
#include "frames/SpanChecksums.h"
#include "fuzz/support/MemoryFile.h"
#include "fuzz/support/ParcelInput.h"
#include "tools/zelkctl/files/ConfigFile.h"
#include "tools/zelkctl/files/FrameSummary.h"
#include "tools/zelkctl/files/GestureFile.h"
#include "tools/zelkctl/services/EventRecord.h"
#include "tools/zelkctl/services/FrameReceiver.h"
#include "tools/zelkctl/terminal/Json.h"

namespace {

using namespace pemaro;

/// Overwrites bytes anywhere.
void damage(void* bytes, size_t size, FuzzedDataProvider& input) {
    for (int left = input.ConsumeIntegralInRange(0, 8); left > 0; --left) {
        const auto place = input.ConsumeIntegralInRange<size_t>(0, size - 1);
        static_cast<uint8_t*>(bytes)[place] = input.ConsumeIntegral<uint8_t>();
    }
}

/// Frames, some of them damaged, with anything before, between and behind them.
std::string recording(FuzzedDataProvider& input) {
    static auto& generator = *new frames::FrameGenerator(96, 1);
    // Some are longer than what is read at once for a checksum.
    static auto& longer = *new frames::FrameGenerator(frames::SpanChecksums::kBlockBytes + 1024, 1);
    std::string bytes;
    for (uint32_t left = input.ConsumeIntegralInRange<uint32_t>(0, 6); left > 0; --left) {
        if (input.ConsumeBool()) {
            bytes += input.ConsumeRandomLengthString(64);
            continue;
        }
        const auto sequence = input.ConsumeIntegral<uint8_t>();
        const auto time = input.ConsumeIntegral<uint64_t>();
        const auto& drawn =
                (sequence % 8 == 7 ? longer : generator)
                        .draw(sequence, time, input.ConsumeIntegralInRange<uint32_t>(0, 3));
        std::string frame(drawn.begin(), drawn.end());
        damage(frame.data(), frame.size(), input);
        bytes += frame;
    }
    bytes.resize(bytes.size() - input.ConsumeIntegralInRange<size_t>(0, bytes.size()));
    return bytes;
}

void checkRecording(FuzzedDataProvider& input) {
    const std::string bytes = recording(input);
    const fuzz::MemoryFile file(bytes);
    std::string problem;
    const auto read = frames::RecordingFile::open(file.path(), &problem);
    fuzz::expect((read == nullptr) == !problem.empty(), "a refusal without a reason");
    if (read == nullptr) {
        return;
    }
    uint64_t end = 0;
    uint64_t intact = 0;
    for (const auto& part : read->parts()) {
        fuzz::expect(part.offset == end && part.length > 0, "parts with a gap between them");
        end += part.length;
        const bool isFrame = part.kind == frames::RecordingFile::Kind::kFrame;
        fuzz::expect(isFrame == (part.problem == nullptr), "damage without a word about it");
        fuzz::expect(!isFrame || frames::frameFault(read->bytes(part), part.length) == nullptr,
                     "a damaged frame taken for an intact one");
        intact += isFrame ? 1 : 0;
    }
    fuzz::expect(end == bytes.size(), "parts that are not the whole file");
    const zelkctl::FrameSummary summary = zelkctl::summarize(*read);
    fuzz::expect(summary.frames == intact, "another number of frames");
    fuzz::expect(zelkctl::isJson(zelkctl::summaryJson(*read, summary)),
                 "a summary that is no JSON");
    fuzz::expect(!zelkctl::summaryText(*read, summary).empty(), "nothing to say");
}

void checkFrame(FuzzedDataProvider& input) {
    const auto packet = input.ConsumeIntegralInRange<uint32_t>(0, 512);
    std::string frame = recording(input);
    if (frame.size() >= sizeof(frames::FrameHeader) && input.ConsumeBool()) {
        // With the right checksum it is the rest that decides.
        const uint32_t checksum = frames::frameChecksum(frame.data(), frame.size());
        memcpy(&frame[offsetof(frames::FrameHeader, checksum)], &checksum, sizeof(checksum));
    }
    if (frames::frameFault(frame.data(), frame.size()) == nullptr) {
        const frames::FrameContent content = frames::readFrameContent(frame.data());
        fuzz::expect(content.fingers.size() == content.header.fingers &&
                             content.image.size() ==
                                     size_t{content.header.rows} * content.header.columns,
                     "another frame than its header tells of");
    }
    // A packet's bytes are always there.
    frame.resize(packet);
    zelkctl::FrameReceiver receiver(nullptr, 0);
    receiver.setPacketSize(packet);
    uint32_t length = 0;
    if (packet >= 12) {
        memcpy(&length, &frame[8], sizeof(length));
    }
    zelkctl::FrameReceiver::onFrame(0, frame.data(), length, &receiver);
    fuzz::expect(receiver.stats().frames + receiver.stats().corrupt == 1, "a frame is missing");
}

void checkConfigFile(FuzzedDataProvider& input) {
    const auto limit = input.ConsumeIntegralInRange<size_t>(0, 64);
    const std::string bytes = input.ConsumeRandomLengthString(128);
    const fuzz::MemoryFile file(bytes);
    std::string read;
    const zelkctl::FileResult result = zelkctl::readConfigFile(file.path(), limit, read);
    fuzz::expect(result.isGood() == (bytes.size() <= limit), "a size that was misjudged");
    fuzz::expect(!result.isGood() || read == bytes, "a file was read as another");
}

void checkGestures(FuzzedDataProvider& input) {
    constexpr size_t kRecord = sizeof(IGestureManagerClient::GestureData);
    constexpr size_t kMost = 1;
    std::string bytes(input.ConsumeIntegralInRange<size_t>(0, kMost + 1) * kRecord, 'r');
    bytes += input.ConsumeRandomLengthString(32);
    if (!bytes.empty()) {
        damage(bytes.data(), bytes.size(), input);
    }
    std::vector<IGestureManagerClient::GestureData> records;
    const std::string problem =
            zelkctl::readGestures(fuzz::MemoryFile(bytes).path(), kMost, records);
    const bool good =
            !bytes.empty() && bytes.size() % kRecord == 0 && bytes.size() <= kMost * kRecord;
    fuzz::expect(problem.empty() == good, "records that were misjudged");
    fuzz::expect(!good || (records.size() == bytes.size() / kRecord &&
                           memcmp(records.data(), bytes.data(), bytes.size()) == 0),
                 "other records than the file's");
}

template <typename Record>
void checkEvent(FuzzedDataProvider& input, void (*seal)(Record*)) {
    static auto& record = *new Record;
    record = {};
    seal(&record);
    damage(&record, sizeof(record) / 64, input);
    if (input.ConsumeBool()) {
        seal(&record);
    }
    // What is behind the seal.
    if (input.ConsumeIntegralInRange(0, 7) == 0) {
        damage(&record, sizeof(record), input);
    }
    const zelkctl::EventRecord read = zelkctl::EventRecord::read(&record, sizeof(record));
    if (!read.isKnown()) {
        return;
    }
    zelkctl::JsonObject object;
    read.describe(object, input.ConsumeBool());
    fuzz::expect(!read.words().empty() && zelkctl::isJson(object.text()), "an event without words");
    read.drawing(input.ConsumeBool());
    fuzz::expect(read.passes({}), "an event that is not its own kind");
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    FuzzedDataProvider input(data, size);
    switch (input.ConsumeIntegralInRange(0, 15)) {
        case 0:
            checkGestures(input);
            break;
        case 1:
            checkEvent(input, simulator::sealGestureRecord);
            break;
        case 2:
        case 3:
            checkEvent(input, simulator::sealHandRecord);
            break;
        case 4:
        case 5:
            checkConfigFile(input);
            break;
        case 6:
        case 7:
        case 8:
        case 9:
            checkFrame(input);
            break;
        default:
            checkRecording(input);
            break;
    }
    return 0;
}
