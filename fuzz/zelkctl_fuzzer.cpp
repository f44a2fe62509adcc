// SPDX-License-Identifier: Apache-2.0

// What zelkctl and the simulated stack read from users, files and frames: numbers and lists of them, orders of
// faults, configurations, files of gestures, recorded frames and recordings.

#include <fcntl.h>
#include <fuzzer/FuzzedDataProvider.h>
#include <rapidjson/document.h>
#include <sys/mman.h>
#include <unistd.h>

#include <cctype>
#include <cerrno>
#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <string>
#include <vector>

#include "frames/Frame.h"
#include "frames/FrameGenerator.h"
#include "frames/RecordingFile.h"
#include "fuzz/support/ParcelInput.h"
#include "simulator/companion/Configuration.h"
#include "simulator/faults/Fault.h"
#include "tools/common/Number.h"
#include "tools/zelkctl/files/ConfigFile.h"
#include "tools/zelkctl/files/FrameSummary.h"
#include "tools/zelkctl/files/GestureFile.h"
#include "tools/zelkctl/services/FrameReceiver.h"
#include "tools/zelkctl/terminal/Json.h"

namespace {

using namespace pemaro;

/// A file in memory with these bytes.
class File {
  public:
    explicit File(const std::string& bytes) : mFd(memfd_create("input", MFD_CLOEXEC)) {
        fuzz::expect(write(mFd, bytes.data(), bytes.size()) == static_cast<ssize_t>(bytes.size()),
                     "the file was not written");
    }
    ~File() { close(mFd); }
    File(const File&) = delete;
    File& operator=(const File&) = delete;

    std::string path() const { return "/proc/self/fd/" + std::to_string(mFd); }

  private:
    const int mFd;
};

void checkNumber(const std::string& text) {
    const auto number = tools::parseNumber(text, tools::kAny32);
    errno = 0;
    char* end = nullptr;
    const long long expected = strtoll(text.c_str(), &end, 0);
    const bool whole = !text.empty() && isspace(static_cast<unsigned char>(text[0])) == 0 &&
                       end == text.c_str() + text.size() && errno == 0 && expected >= INT32_MIN &&
                       expected <= UINT32_MAX;
    fuzz::expect(number.has_value() == whole && (!whole || *number == expected), "another number");
    const auto decimal = tools::parseDecimal(text, {-1e6, 1e6});
    fuzz::expect(!decimal || (*decimal >= -1e6 && *decimal <= 1e6), "a number out of its range");
}

void checkJson(const std::string& name, const std::string& value) {
    zelkctl::JsonObject object;
    object.add("x" + name, value)
            .add("list", std::vector<std::string>{value, name})
            .addParsed("parsed", value)
            .add("number", 3);
    const std::string text = object.text();
    rapidjson::Document read;
    read.Parse(text.c_str());
    fuzz::expect(!read.HasParseError() && read.IsObject() && read["number"].GetInt() == 3,
                 "what was written is no JSON");
    fuzz::expect(text.find('\n') == std::string::npos, "an object on two lines");
}

void checkFault(const std::string& text) {
    std::string problem;
    const auto fault = simulator::Fault::parse(text, &problem);
    fuzz::expect(fault.has_value() == problem.empty(), "a refusal without a reason");
}

void checkConfiguration(const std::string& bytes) {
    simulator::Configuration configuration;
    const std::string before = configuration.toBinary();
    const bool read = configuration.fromBinary(bytes.data(), bytes.size()) == 0;
    fuzz::expect(read || configuration.toBinary() == before, "a failure changed something");
    if (!fuzz::isFatalText(bytes.c_str())) {
        const std::string now = configuration.toBinary();
        const bool loaded = configuration.load(File(bytes).path()) == 0;
        fuzz::expect(loaded || configuration.toBinary() == now, "a failure changed something");
    }
}

void checkFiles(const std::string& bytes, size_t limit) {
    const File file(bytes);
    std::string read;
    const zelkctl::FileResult result = zelkctl::readConfigFile(file.path(), limit, read);
    fuzz::expect(result.isGood() == (bytes.size() <= limit), "a size that was misjudged");
    fuzz::expect(!result.isGood() || read == bytes, "a file was read as another");
}

// About as many bytes as a few records have.
void checkGestures(uint32_t number) {
    constexpr size_t kRecord = sizeof(IGestureManagerClient::GestureData);
    constexpr size_t kMost = 3;
    const size_t size = number % 6 * kRecord + number / 6 % 3;
    std::vector<IGestureManagerClient::GestureData> records;
    const std::string problem =
            zelkctl::readGestures(File(std::string(size, 'r')).path(), kMost, records);
    const bool good = size > 0 && size % kRecord == 0 && size / kRecord <= kMost;
    fuzz::expect(problem.empty() == good, "records that were misjudged");
    fuzz::expect(!good || records.size() == size / kRecord, "another number of records");
}

void checkFrame(const std::string& bytes, uint32_t packet) {
    frames::FrameHeader header;
    frames::readFrameHeader(bytes.data(), bytes.size(), &header);
    const char* fault = frames::frameFault(bytes.data(), bytes.size());
    fuzz::touch(fault, fault == nullptr ? 0 : 1);
    // A packet's bytes are always there.
    std::string frame = bytes;
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

/// Frames, some of them damaged, with anything before, between and behind them.
std::string recording(FuzzedDataProvider& input) {
    static auto& generator = *new frames::FrameGenerator(96, 1);
    std::string bytes;
    for (uint32_t left = input.ConsumeIntegralInRange<uint32_t>(0, 6); left > 0; --left) {
        if (input.ConsumeBool()) {
            bytes += input.ConsumeRandomLengthString(64);
            continue;
        }
        const auto& frame =
                generator.draw(input.ConsumeIntegral<uint8_t>(), input.ConsumeIntegral<uint64_t>(),
                               frames::kFilterDefault);
        bytes.append(frame.begin(), frame.end());
        if (input.ConsumeBool()) {
            const auto place = input.ConsumeIntegralInRange<size_t>(0, frame.size() - 1);
            bytes[bytes.size() - 1 - place] = input.ConsumeIntegral<char>();
        }
    }
    bytes.resize(bytes.size() - input.ConsumeIntegralInRange<size_t>(0, bytes.size()));
    return bytes;
}

void checkRecording(const std::string& bytes) {
    const File file(bytes);
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

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    FuzzedDataProvider input(data, size);
    const int reader = input.ConsumeIntegralInRange(0, 7);
    if (reader == 7) {
        checkRecording(recording(input));
        return 0;
    }
    const auto number = input.ConsumeIntegralInRange<uint32_t>(0, 4096);
    const std::string first = input.ConsumeRandomLengthString(64);
    const std::string rest = input.ConsumeRemainingBytesAsString();
    switch (reader) {
        case 0:
            checkNumber(first.c_str());
            break;
        case 1:
            checkJson(first.c_str(), rest);
            break;
        case 2:
            checkFault(first);
            break;
        case 3:
            checkConfiguration(rest);
            break;
        case 4:
            checkFiles(rest, number);
            break;
        case 5:
            checkGestures(number);
            break;
        default:
            checkFrame(rest, number);
            break;
    }
    return 0;
}
