// SPDX-License-Identifier: Apache-2.0

// What zelkctl and the simulated stack are told by users: numbers, orders of faults, configurations, command
// lines, and answers to be shown as JSON.

#include <fuzzer/FuzzedDataProvider.h>
#include <rapidjson/document.h>

#include <CLI/CLI.hpp>
#include <cctype>
#include <cerrno>
#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <string>
#include <vector>

#include "fuzz/support/MemoryFile.h"
#include "fuzz/support/ParcelInput.h"
#include "simulator/companion/Configuration.h"
#include "simulator/faults/Fault.h"
#include "tools/common/CommandLine.h"
#include "tools/common/Number.h"
#include "tools/zelkctl/terminal/Json.h"

namespace {

using namespace pemaro;

void checkNumber(const std::string& text) {
    const auto number = tools::parseNumber(text, tools::kAny32);
    errno = 0;
    char* end = nullptr;
    const long long expected = strtoll(text.c_str(), &end, 0);
    const bool whole = !text.empty() && text[0] != '+' &&
                       isspace(static_cast<unsigned char>(text[0])) == 0 &&
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
        const bool loaded = configuration.load(fuzz::MemoryFile(bytes).path()) == 0;
        fuzz::expect(loaded || configuration.toBinary() == now, "a failure changed something");
    }
}

/// A command line with one of each: what is refused has a reason, and what is taken arrived.
void checkCommandLine(const std::string& text) {
    std::vector<std::string> words{"program"};
    for (const char c : text) {
        if (c == ' ') {
            words.emplace_back();
        } else if (words.size() > 1) {
            words.back() += c;
        }
    }
    std::vector<char*> arguments;
    for (std::string& word : words) arguments.push_back(word.data());

    CLI::App app;
    app.set_help_flag("");
    app.require_subcommand(1);
    std::string name = "unset";
    int count = 0;
    CLI::App* const watch = app.add_subcommand("watch");
    watch->add_option("-n,--name", name);
    watch->add_flag("-v,--verbose");
    watch->add_option("count", count)->required();
    app.add_subcommand("list")->add_subcommand("all");
    std::string problem;
    const auto status =
            tools::parseCommandLine(app, static_cast<int>(arguments.size()), arguments.data(),
                                    nullptr, [&](const std::string& told) { problem = told; });
    fuzz::expect(status.has_value() == !problem.empty(), "a refusal without a reason");
    fuzz::expect(status.has_value() || !name.empty(), "an empty argument was taken");
    fuzz::expect(status.has_value() || watch->parsed() == (watch->count("count") == 1),
                 "a command without what it requires");
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    FuzzedDataProvider input(data, size);
    const int reader = input.ConsumeIntegralInRange(0, 7);
    const std::string first = input.ConsumeRandomLengthString(64);
    const std::string rest = input.ConsumeRemainingBytesAsString();
    switch (reader) {
        case 0:
        case 1:
            checkNumber(first.c_str());
            break;
        case 2:
        case 3:
            checkJson(first.c_str(), rest);
            break;
        case 4:
        case 5:
            checkFault(first);
            break;
        case 6:
            checkConfiguration(rest);
            break;
        default:
            checkCommandLine(first.c_str());
            break;
    }
    return 0;
}
