// SPDX-License-Identifier: Apache-2.0
// The columns "request" and "reply" of the tables in the documents of the protocols, against the stubs: one reads
// exactly as many bytes as its row tells, and writes what the row tells, the status in its place.

#include <gtest/gtest.h>
#include <utils/String8.h>

#include <algorithm>
#include <cstdint>
#include <fstream>
#include <map>
#include <ostream>
#include <regex>
#include <set>
#include <string>
#include <vector>

#include "pemaro/BasicGestureManagerService.h"
#include "pemaro/BasicHandBiometricManagerService.h"
#include "pemaro/BasicTouchCompanionService.h"
#include "pemaro/BasicTouchManagerService.h"
#include "pemaro/IGestureManagerClient.h"
#include "pemaro/IHandBiometricManagerClient.h"
#include "pemaro/Status.h"
#include "tests/support/LocalMemory.h"

namespace pemaro::test {

namespace {

using android::IBinder;
using android::Parcel;
using android::sp;

// How many there are of each thing whose number stands before it. As the length of a text it is none that a few
// numbers take as many bytes as.
constexpr int32_t kCount = 20;
// Other numbers, one after the other: the one is a length that can be read, the other has no byte that ends a name.
constexpr int32_t kNumbers[] = {kCount, 0x01010101};

// ---- services that answer each operation with one status, which no other field of a reply holds ----

struct Companion : BasicTouchCompanionService {
    int registerClient(const sp<ITouchCompanionClient>&) override { return STATUS_UNSUPPORTED; }
    int unregisterClient() override { return STATUS_UNSUPPORTED; }
    int open() override { return STATUS_UNSUPPORTED; }
    int close() override { return STATUS_UNSUPPORTED; }
    sp<android::IMemory> getCblk() override { return new LocalMemory(64); }
    int getPacketSize() override { return kCount; }
    using BasicTouchCompanionService::getConfigParams;
    size_t getConfigParams(void*, size_t) override { return kCount; }
};

struct TouchManager : BasicTouchManagerService {
    int subscribe(const sp<ITouchManagerClient>&) override { return STATUS_UNSUPPORTED; }
    int unsubscribe(const sp<ITouchManagerClient>&) override { return STATUS_UNSUPPORTED; }
};

struct GestureManager : BasicGestureManagerService {
    int subscribe(const sp<IGestureManagerClient>&) override { return STATUS_UNSUPPORTED; }
    int unsubscribe(const sp<IGestureManagerClient>&) override { return STATUS_UNSUPPORTED; }
};

struct HandBiometricManager : BasicHandBiometricManagerService {
    int subscribe(const sp<IHandBiometricManagerClient>&) override { return STATUS_UNSUPPORTED; }
    int unsubscribe(const sp<IHandBiometricManagerClient>&) override { return STATUS_UNSUPPORTED; }
    int getProfileList(std::vector<std::string>& names) override {
        names.assign(kCount, "a name");
        return STATUS_UNSUPPORTED;
    }
};

// ---- the tables ----

struct Field {
    std::string type;
    bool isCounted = false;  // as many as the number before it
};

struct Row {
    uint32_t code;
    std::string operation;
    std::vector<Field> request;
    std::vector<Field> reply;
};

// What a cell tells of, the names aside. A field without a type has the type of the one before it, and what begins
// with "which" or "none" tells of no more.
std::vector<Field> fieldsOf(const std::string& cell) {
    static const std::regex field("([a-zA-Z0-9]+)(\\[[a-z]+\\])?( × count)?( [^,]*)?(, )?");
    static const std::set<std::string> types = {"int32",  "uint32", "S",       "flag",
                                                "answer", "text",   "map",     "array",
                                                "binder", "name",   "gesture", "bytes"};
    std::vector<Field> fields;
    const std::string told = cell.substr(0, std::min(cell.find(", which"), cell.find("none")));
    for (std::sregex_iterator it(told.begin(), told.end(), field), end; it != end; ++it) {
        const std::string word = (*it)[1];
        if (types.count(word) != 0) {
            fields.push_back({word, (*it)[2].matched || (*it)[3].matched});
        } else if (!fields.empty()) {
            fields.push_back(fields.back());
        } else {
            ADD_FAILURE() << "of no known type: " << cell;
        }
    }
    return fields;
}

std::vector<std::string> cellsOf(const std::string& line) {
    std::vector<std::string> cells;
    for (size_t at = 1; at < line.size();) {
        const size_t end = line.find('|', at);
        const std::string cell = line.substr(at, end - at);
        const size_t first = cell.find_first_not_of(' ');
        const size_t last = cell.find_last_not_of(' ');
        cells.push_back(first == std::string::npos ? "" : cell.substr(first, last - first + 1));
        at = end == std::string::npos ? end : end + 1;
    }
    return cells;
}

// The rows of the table of an interface.
std::vector<Row> readTable(const std::string& document, const std::string& interface) {
    std::ifstream text(ZELK_SOURCE_DIR "/docs/" + document);
    std::vector<Row> rows;
    std::vector<std::string> heads;
    bool inside = false;
    for (std::string line; std::getline(text, line);) {
        if (line.rfind("## ", 0) == 0) {
            inside = line.find("`" + interface + "`") != std::string::npos;
        } else if (inside && line.rfind("| code ", 0) == 0) {
            heads = cellsOf(line);
        } else if (inside && std::regex_search(line, std::regex("^\\| [0-9]"))) {
            const std::vector<std::string> cells = cellsOf(line);
            std::map<std::string, std::string> cell;
            for (size_t i = 0; i < cells.size() && i < heads.size(); ++i) {
                cell[heads[i]] = cells[i];
            }
            rows.push_back({static_cast<uint32_t>(std::stoul(cell["code"])), cell["operation"],
                            fieldsOf(cell["request"]), fieldsOf(cell["reply"])});
        }
    }
    return rows;
}

// ---- parcels ----

bool isText(const std::string& type) {
    return type == "text" || type == "map" || type == "array";
}

// How often a field stands there.
int32_t timesOf(const Field& field) {
    return field.isCounted && field.type != "bytes" ? kCount : 1;
}

void writeOne(const std::string& type, int32_t number, Parcel& parcel) {
    static const std::string gesture(sizeof(IGestureManagerClient::GestureData), '\0');
    if (isText(type)) {
        parcel.writeString8(android::String8("som\0text", 8));  // more than a name
    } else if (type == "binder") {
        parcel.writeStrongBinder(nullptr);
    } else if (type == "name") {
        parcel.writeCString("a name");
    } else if (type == "gesture") {
        parcel.write(gesture.data(), gesture.size());
    } else if (type == "bytes") {
        parcel.write(gesture.data(), kCount);
    } else {
        EXPECT_NE("S", type) << "a request has no status";
        parcel.writeInt32(number);
    }
}

void writeRequest(const std::vector<Field>& fields, int32_t number, Parcel& parcel) {
    for (size_t i = 0; i < fields.size(); ++i) {
        const bool counts = i + 1 < fields.size() && fields[i + 1].isCounted;
        for (int32_t left = timesOf(fields[i]); left > 0; --left) {
            writeOne(fields[i].type, counts ? kCount : number, parcel);
        }
    }
}

// False where something else is there.
bool readOne(const std::string& type, const Parcel& parcel) {
    const size_t begin = parcel.dataPosition();
    const size_t left = parcel.dataAvail();
    if (type == "binder") {
        return parcel.readStrongBinder() != nullptr;
    }
    if (type == "name") {
        return parcel.readCString() != nullptr;
    }
    if (type == "bytes") {
        return parcel.readInplace(kCount) != nullptr;
    }
    const int32_t number = parcel.readInt32();
    if (isText(type)) {
        parcel.setDataPosition(begin);
        return left >= sizeof(number) &&
               static_cast<int32_t>(parcel.readString8().size()) == number;
    }
    return left >= sizeof(number) && (type == "S") == (number == STATUS_UNSUPPORTED);
}

void expectReply(const std::vector<Field>& fields, const Parcel& parcel) {
    parcel.setDataPosition(0);
    for (const Field& field : fields) {
        for (int32_t left = timesOf(field); left > 0; --left) {
            EXPECT_TRUE(readOne(field.type, parcel)) << field.type;
        }
    }
    EXPECT_EQ(0u, parcel.dataAvail()) << "there is more in the reply";
}

struct Table {
    const char* document;
    const char* interface;
    IBinder* (*make)();
};

template <typename Service>
IBinder* make() {
    return new Service;
}

void PrintTo(const Table& table, std::ostream* out) {
    *out << table.interface;
}

class Protocol : public ::testing::TestWithParam<Table> {};

INSTANTIATE_TEST_SUITE_P(
        EveryService, Protocol,
        ::testing::Values(Table{"binder-protocol.md", "ITouchCompanionService", make<Companion>},
                          Table{"manager-protocol.md", "ITouchManagerService", make<TouchManager>},
                          Table{"manager-protocol.md", "IGestureManagerService",
                                make<GestureManager>},
                          Table{"manager-protocol.md", "IHandBiometricManagerService",
                                make<HandBiometricManager>}),
        [](const auto& info) { return info.param.interface; });

}  // namespace

TEST_P(Protocol, TellsWhatTheStubReadsAndWrites) {
    const std::vector<Row> rows = readTable(GetParam().document, GetParam().interface);
    EXPECT_LE(7u, rows.size()) << "is the table written in another way?";
    // A stub that reads more than is told finds something: records, or the end of a name.
    std::string behind(kCount * sizeof(IGestureManagerClient::GestureData), 'Z');
    behind.append(sizeof(int32_t), '\0');
    for (const Row& row : rows) {
        for (const int32_t number : kNumbers) {
            SCOPED_TRACE(row.operation);
            const sp<IBinder> stub = GetParam().make();
            Parcel request;
            Parcel reply;
            request.writeInterfaceToken(stub->getInterfaceDescriptor());
            writeRequest(row.request, number, request);
            const size_t told = request.dataPosition();
            request.write(behind.data(), behind.size());
            stub->transact(row.code, request, &reply);
            EXPECT_EQ(told, request.dataPosition()) << "where the stub stops to read";
            expectReply(row.reply, reply);
        }
    }
}

}  // namespace pemaro::test
