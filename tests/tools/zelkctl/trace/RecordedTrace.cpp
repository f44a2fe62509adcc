// SPDX-License-Identifier: Apache-2.0
#include "tests/tools/zelkctl/trace/RecordedTrace.h"

#include <cmath>
#include <map>
#include <regex>
#include <sstream>
#include <stdexcept>

namespace pemaro::zelkctl {
namespace {

using Kind = BinderEvent::Kind;

const std::map<std::string, Kind> kKinds = {
        {"binder_transaction", Kind::kSent},
        {"binder_transaction_received", Kind::kReceived},
        {"binder_transaction_alloc_buf", Kind::kBuffer},
        {"binder_transaction_node_to_ref", Kind::kNode},
        {"binder_transaction_ref_to_ref", Kind::kNode},
        {"binder_return", Kind::kReturn},
};

}  // namespace

std::vector<BinderEvent> readEventLines(const std::string& text) {
    static const std::regex kLine(R"( *\S+-(\d+) +\[\d+\] +(\d+\.\d+): (\w+): (.*))");
    static const std::regex kField(R"((\w+)=(0x[0-9a-f]+|\d+))");
    std::vector<BinderEvent> events;
    std::istringstream lines(text);
    for (std::string line; std::getline(lines, line);) {
        std::smatch parts;
        if (line.empty() || line[0] == '#') {
            continue;
        }
        if (!std::regex_match(line, parts, kLine)) {
            throw std::invalid_argument("no event: " + line);
        }
        std::map<std::string, unsigned long> fields;
        const std::string rest = parts[4];
        for (std::sregex_iterator field(rest.begin(), rest.end(), kField), end; field != end;
             ++field) {
            fields[(*field)[1]] = std::stoul((*field)[2], nullptr, 0);
        }
        BinderEvent event;
        event.kind = kKinds.at(parts[3]);
        event.thread = std::stoi(parts[1]);
        event.time = std::llround(std::stod(parts[2]) * 1e6) * 1000;
        event.number = static_cast<int>(fields["transaction"]);
        event.object = static_cast<int>(fields["dest_node"] + fields["node"]);
        event.process = static_cast<int>(fields["dest_proc"]);
        event.toThread = static_cast<int>(fields["dest_thread"]);
        event.isReply = fields["reply"] != 0;
        event.code = static_cast<uint32_t>(fields["code"]);
        event.flags = static_cast<uint32_t>(fields["flags"]);
        event.size = fields["data_size"];
        event.command = static_cast<uint32_t>(fields["cmd"]);
        events.push_back(event);
    }
    return events;
}

}  // namespace pemaro::zelkctl
