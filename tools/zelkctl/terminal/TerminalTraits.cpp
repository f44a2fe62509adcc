// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/terminal/TerminalTraits.h"

#include <strings.h>
#include <unistd.h>

#include <cstdlib>
#include <cstring>
#include <string>

#include "tools/common/Terminal.h"

namespace pemaro::zelkctl {
namespace {

using Variable = std::function<const char*(const char*)>;

std::string textOf(const Variable& variable, const char* name) {
    const char* value = variable(name);
    return value == nullptr ? "" : value;
}

bool contains(const std::string& text, const char* part) {
    return text.find(part) != std::string::npos;
}

}  // namespace

Colors colorsOf(const Variable& variable) {
    const std::string terminal = textOf(variable, "TERM");
    const std::string depth = textOf(variable, "COLORTERM");
    // Any NO_COLOR that is not empty counts, whatever it says.
    if (!textOf(variable, "NO_COLOR").empty() || !tools::canBeDrawnOn(terminal)) {
        return Colors::kNone;
    }
    if (depth == "truecolor" || depth == "24bit" || contains(terminal, "direct")) {
        return Colors::kTrue;
    }
    return contains(terminal, "256color") ? Colors::k256 : Colors::kNone;
}

bool isUnicode(const Variable& variable) {
    for (const char* name : {"LC_ALL", "LC_CTYPE", "LANG"}) {
        const std::string locale = textOf(variable, name);
        if (!locale.empty()) {
            return strcasestr(locale.c_str(), "utf-8") != nullptr ||
                   strcasestr(locale.c_str(), "utf8") != nullptr;
        }
    }
    return false;
}

TerminalTraits terminalTraits() {
    TerminalTraits traits;
    traits.isTerminal = tools::isTerminal(STDOUT_FILENO);
    const auto environment = [](const char* name) -> const char* { return getenv(name); };
    traits.unicode = isUnicode(environment);
    if (!traits.isTerminal) {
        return traits;
    }
    traits.colors = colorsOf(environment);
    const tools::TerminalSize size = tools::terminalSize(STDOUT_FILENO);
    traits.columns = size.columns;
    traits.rows = size.rows;
    return traits;
}

}  // namespace pemaro::zelkctl
