// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/services/MapText.h"

#include <fmt/core.h>

#include "pemaro/Status.h"
#include "tools/zelkctl/terminal/Output.h"
#include "tools/zelkctl/terminal/Printable.h"
#include "tools/zelkctl/terminal/Report.h"

namespace pemaro::zelkctl {
namespace {

std::string textOf(SerializableMap& map, const std::string& key) {
    SerializableValue value = map.valueFor(key);
    return value.serialize();
}

}  // namespace

std::string keyProblem(const std::string& key) {
    if (key.empty()) {
        return "there is no name";
    }
    return key.find_first_of("\"\\") == std::string::npos
                   ? ""
                   : fmt::format("'{}' is no name: it has a quote or a backslash", key);
}

std::vector<std::string> keysOf(SerializableMap& map) {
    std::vector<std::string> keys(map.size());
    for (size_t i = 0; i < keys.size(); ++i) {
        map.keyAt(i, keys[i]);
    }
    return keys;
}

std::string linesOf(SerializableMap& map, const std::vector<std::string>& keys) {
    std::string lines;
    for (const std::string& key : keys) {
        lines += fmt::format("{}{}={}", lines.empty() ? "" : "\n", key, textOf(map, key));
    }
    return lines;
}

void addEntries(JsonObject& object, SerializableMap& map, const std::vector<std::string>& keys) {
    for (const std::string& key : keys) {
        if (map.getType(key) == VALUE_TYPE_STRING) {
            object.add(key, textOf(map, key));
        } else {
            object.addParsed(key, textOf(map, key));
        }
    }
}

int sayEntries(const std::string& command, SerializableMap& map,
               const std::vector<std::string>& keys) {
    std::vector<std::string> missing;
    for (const std::string& key : keys) {
        if (!map.contains(key)) {
            missing.push_back(key);
        }
    }
    if (!missing.empty()) {
        return failStatus(command, STATUS_NOT_FOUND, joined(missing));
    }
    const std::vector<std::string> all = keys.empty() ? keysOf(map) : keys;
    JsonObject object;
    addEntries(object, map, all);
    sayResult(linesOf(map, all), object);
    return tools::kExitSuccess;
}

std::string readPairs(const std::vector<std::string>& pairs, SerializableMap& map) {
    for (const std::string& pair : pairs) {
        const size_t equals = pair.find('=');
        if (equals == std::string::npos) {
            return fmt::format("'{}' is no KEY=VALUE", pair);
        }
        const std::string key = pair.substr(0, equals);
        std::string wrong = keyProblem(key);
        const std::string value = pair.substr(equals + 1);
        if (wrong.empty() && value.empty()) {
            wrong = fmt::format("{} is given no value", key);
        }
        if (wrong.empty() && value.find('\\') != std::string::npos) {
            wrong = fmt::format("the value of {} has a backslash", key);
        }
        if (!wrong.empty()) {
            return wrong;
        }
        SerializableMap one;
        if (isJson(value)) {
            if (one.unserialize(fmt::format("{{\"{}\":{}}}", key, value)) != STATUS_NO_ERROR) {
                return fmt::format("the value of {} cannot be read: {}", key, value);
            }
        } else if (value.find('"') != std::string::npos) {
            return fmt::format("the value of {} has a quote", key);
        } else {
            one.add(key, value);
        }
        map += one;
    }
    return "";
}

}  // namespace pemaro::zelkctl
