// SPDX-License-Identifier: Apache-2.0
#include "tests/tools/zelkctl/trace/RecordedTrace.h"

#include <gtest/gtest.h>

#include <cmath>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <map>
#include <sstream>

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

/// What `text` tells as name=number, among other words.
std::map<std::string, unsigned long> fieldsOf(const std::string& text) {
    std::map<std::string, unsigned long> fields;
    std::istringstream words(text);
    for (std::string word; words >> word;) {
        const size_t equals = word.find('=');
        if (equals == 0 || equals == std::string::npos) {
            continue;
        }
        const char* number = word.c_str() + equals + 1;
        char* end = nullptr;
        const unsigned long value = strtoul(number, &end, 0);
        if (end != number) {
            fields[word.substr(0, equals)] = value;
        }
    }
    return fields;
}

}  // namespace

// By hand: <regex> would be a third of what this program's tests take to compile.
std::vector<BinderEvent> readEventLines(const std::string& text) {
    std::vector<BinderEvent> events;
    std::istringstream lines(text);
    for (std::string line; std::getline(lines, line);) {
        if (line.empty() || line[0] == '#') {
            continue;
        }
        // zelkctl-1234    [001] 12345.678901: binder_return: cmd=0x80407202
        char task[64];
        char name[64];
        double seconds = 0;
        int rest = 0;
        sscanf(line.c_str(), " %63s [%*[0-9]] %lf: %63[a-z_]: %n", task, &seconds, name, &rest);
        const char* thread = rest == 0 ? nullptr : strrchr(task, '-');
        if (thread == nullptr) {
            ADD_FAILURE() << "no event: " << line;
            continue;
        }
        std::map<std::string, unsigned long> fields = fieldsOf(line.substr(rest));
        BinderEvent event;
        event.kind = kKinds.at(name);
        event.thread = std::stoi(thread + 1);
        event.time = std::llround(seconds * 1e6) * 1000;
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
