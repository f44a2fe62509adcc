// SPDX-License-Identifier: Apache-2.0
#include "tests/values/reference/Comparison.h"

#include <sstream>

#include "pemaro/testkit/LogRecorder.h"
#include "tests/values/reference/ReferenceReader.h"

namespace pemaro::reference {

namespace {

using test::LogLine;
using test::LogRecorder;

SerializableMap filled(const SerializableMap*) {
    SerializableMap map;
    map.add("before", 1);
    return map;
}

SerializableMapArray filled(const SerializableMapArray*) {
    SerializableMapArray array;
    array.add(1);
    return array;
}

template <typename Container>
std::string differenceFrom(const Reading& expected, const std::string& text) {
    Container target = filled(static_cast<const Container*>(nullptr));
    const Tree before = treeOf(target);
    LogRecorder::instance().clear();
    const int status = target.unserialize(text);

    std::ostringstream difference;
    if (status != expected.status) {
        difference << "status " << status << ", not " << expected.status << '\n';
    }
    const Tree& contents = expected.status == 0 ? expected.tree : before;
    const Tree actual = treeOf(target);
    if (!(actual == contents)) difference << "read " << actual << ", not " << contents << '\n';
    if (target.serialize() != writeTree(contents)) {
        difference << "writes " << target.serialize() << ", not " << writeTree(contents) << '\n';
    }
    std::vector<LogLine> lines;
    for (const std::string& message : expected.messages) {
        lines.push_back({6, "SerializableMap", message});
    }
    if (LogRecorder::instance().lines() != lines) {
        difference << "logs:\n";
        for (const LogLine& line : LogRecorder::instance().lines()) {
            difference << "  " << line.text << '\n';
        }
        difference << "not:\n";
        for (const LogLine& line : lines) difference << "  " << line.text << '\n';
    }
    return difference.str();
}

}  // namespace

Comparison compare(const std::string& text, As as) {
    const Reading expected = as == As::kMap ? readMap(text) : readArray(text);
    Comparison comparison;
    comparison.aborts = expected.aborts;
    comparison.endedInSpace = expected.endedInSpace;
    if (expected.aborts) return comparison;
    comparison.accepted = expected.status == 0;
    comparison.difference = as == As::kMap ? differenceFrom<SerializableMap>(expected, text)
                                           : differenceFrom<SerializableMapArray>(expected, text);
    return comparison;
}

}  // namespace pemaro::reference
