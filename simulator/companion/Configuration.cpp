// SPDX-License-Identifier: Apache-2.0
#include "simulator/companion/Configuration.h"

#include <fcntl.h>

#include <cstdio>
#include <cstring>
#include <memory>

#include "frames/Checksum.h"
#include "pemaro/SerializableMapArray.h"
#include "pemaro/Status.h"
#include "simulator/Panel.h"
#include "simulator/companion/WholeFile.h"

namespace pemaro::simulator {
namespace {

constexpr uint32_t kMagic = 0x4746435A;
constexpr uint32_t kVersion = 1;
constexpr uint32_t kCells = 36 * 64;
constexpr size_t kMaxFileBytes = 1 << 20;

struct BinaryHeader {
    uint32_t magic;
    uint32_t version;
    uint32_t length;
    uint32_t checksum;
    uint32_t textBytes;
    uint32_t cells;
};
static_assert(sizeof(BinaryHeader) == 24, "configuration layout");

struct FileCloser {
    void operator()(FILE* file) const { fclose(file); }
};
using File = std::unique_ptr<FILE, FileCloser>;

SerializableMap factoryValues() {
    SerializableMapArray zones;
    for (int zone : {0, 120, 240}) {
        zones.add(zone);
    }
    SerializableMap size;
    size.add("height", kPanelHeight);
    size.add("width", kPanelWidth);

    SerializableMap values;
    values.add("device.name", std::string("simulated touch panel"));
    values.add("edge.zones", zones);
    values.add("gain", 1.5f);
    values.add("noise.threshold", 12);
    values.add("palm.rejection", true);
    values.add("panel.size", size);
    values.add("report.rate", 240u);
    values.add("touch.threshold", 80);
    return values;
}

uint32_t binaryChecksum(const std::string& binary) {
    std::string copy = binary;
    memset(&copy[offsetof(BinaryHeader, checksum)], 0, sizeof(uint32_t));
    return frames::crc32(copy.data(), copy.size());
}

/// Waits for nobody who may write to a FIFO: the service would wait as well.
int readFile(const std::string& path, std::string* text) {
    const int fd = open(path.c_str(), O_RDONLY | O_NONBLOCK | O_NOCTTY | O_CLOEXEC);
    File file(fd < 0 ? nullptr : fdopen(fd, "r"));
    if (file == nullptr) {
        return STATUS_ERROR_OPENING_FILE;
    }
    text->resize(kMaxFileBytes + 1);
    text->resize(fread(&(*text)[0], 1, text->size(), file.get()));
    if (ferror(file.get()) != 0) {
        return STATUS_ERROR_READING_FILE;
    }
    return text->size() > kMaxFileBytes ? STATUS_DATA_EXCEEDS_BUFFER : STATUS_NO_ERROR;
}

/// Whether a text can be read as a map: it begins with a bracket, whatever follows is the reader's.
bool looksLikeMap(const std::string& text) {
    return !text.empty() && text[0] == '{';
}

}  // namespace

Configuration::Configuration() : mValues(factoryValues()) {
    calibrate(0);
}

int Configuration::get(SerializableMap& wanted) const {
    SerializableMap answer;
    for (size_t i = 0; i < wanted.size(); ++i) {
        std::string key;
        wanted.keyAt(i, key);
        if (mValues.indexOfKey(key) < 0) {
            return STATUS_NOT_FOUND;
        }
        answer.add(key, mValues.valueFor(key));
    }
    wanted = answer;
    return STATUS_NO_ERROR;
}

std::vector<std::string> Configuration::keys() const {
    SerializableMap values = mValues;
    std::vector<std::string> keys(values.size());
    for (size_t i = 0; i < keys.size(); ++i) {
        values.keyAt(i, keys[i]);
    }
    return keys;
}

int Configuration::set(const SerializableMap& changes) {
    SerializableMap given = changes;
    SerializableMap values = mValues;
    for (size_t i = 0; i < given.size(); ++i) {
        std::string key;
        given.keyAt(i, key);
        if (values.indexOfKey(key) < 0) {
            return STATUS_ERROR_PARSING_CONFIGURATION_SETTING;
        }
        values.replaceValueFor(key, given.valueFor(key));
    }
    mValues = values;
    return STATUS_NO_ERROR;
}

int Configuration::save(const std::string& path) const {
    return writeWholeFile(path, mValues.serialize() + "\n");
}

int Configuration::load(const std::string& path) {
    std::string text;
    const int status = readFile(path, &text);
    if (status != STATUS_NO_ERROR) {
        return status;
    }
    SerializableMap values;
    if (!looksLikeMap(text) || values.unserialize(text) != STATUS_NO_ERROR) {
        return STATUS_ERROR_PARSING_CONFIGURATION_SETTING;
    }
    return set(values);
}

std::string Configuration::toBinary() const {
    const std::string text = mValues.serialize();
    const size_t cellBytes = mCalibration.size() * sizeof(int16_t);
    BinaryHeader header{};
    header.magic = kMagic;
    header.version = kVersion;
    header.length = static_cast<uint32_t>(sizeof(header) + text.size() + cellBytes);
    header.textBytes = static_cast<uint32_t>(text.size());
    header.cells = static_cast<uint32_t>(mCalibration.size());

    std::string binary(reinterpret_cast<const char*>(&header), sizeof(header));
    binary += text;
    binary.append(reinterpret_cast<const char*>(mCalibration.data()), cellBytes);
    header.checksum = binaryChecksum(binary);
    memcpy(&binary[0], &header, sizeof(header));
    return binary;
}

int Configuration::fromBinary(const void* data, size_t size) {
    BinaryHeader header;
    if (size < sizeof(header)) {
        return STATUS_INVALID_FORMAT;
    }
    const std::string binary(static_cast<const char*>(data), size);
    memcpy(&header, binary.data(), sizeof(header));
    if (header.magic != kMagic || header.version != kVersion) {
        return STATUS_INVALID_FORMAT;
    }
    const uint64_t content =
            sizeof(header) + uint64_t{header.textBytes} + uint64_t{header.cells} * sizeof(int16_t);
    if (header.length != size || content != size || header.cells != kCells ||
        header.checksum != binaryChecksum(binary)) {
        return STATUS_CORRUPT_DATA;
    }
    const std::string text = binary.substr(sizeof(header), header.textBytes);
    SerializableMap values;
    if (!looksLikeMap(text) || values.unserialize(text) != STATUS_NO_ERROR) {
        return STATUS_ERROR_PARSING_CONFIGURATION_SETTING;
    }
    const int status = set(values);
    if (status == STATUS_NO_ERROR) {
        memcpy(mCalibration.data(), binary.data() + sizeof(header) + text.size(),
               mCalibration.size() * sizeof(int16_t));
    }
    return status;
}

void Configuration::calibrate(uint32_t seed) {
    mCalibration.resize(kCells);
    uint32_t state = seed * 2654435761u + 1;
    for (int16_t& cell : mCalibration) {
        state = state * 1664525u + 1013904223u;
        cell = static_cast<int16_t>(2000 + (state >> 24));
    }
}

}  // namespace pemaro::simulator
