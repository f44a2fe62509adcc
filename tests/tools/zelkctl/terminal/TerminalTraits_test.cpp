// SPDX-License-Identifier: Apache-2.0
#include "tools/zelkctl/terminal/TerminalTraits.h"

#include <gtest/gtest.h>

#include <map>
#include <string>

namespace pemaro::zelkctl {

namespace {

using Variables = std::map<std::string, std::string>;

std::function<const char*(const char*)> in(const Variables& variables) {
    return [&variables](const char* name) -> const char* {
        const auto found = variables.find(name);
        return found == variables.end() ? nullptr : found->second.c_str();
    };
}

}  // namespace

TEST(TerminalTraits, TellTheColours) {
    const struct {
        Variables variables;
        Colors colors;
    } rows[] = {
            {{}, Colors::kNone},
            {{{"TERM", ""}}, Colors::kNone},
            {{{"TERM", "dumb"}, {"COLORTERM", "truecolor"}}, Colors::kNone},
            {{{"TERM", "vt100"}}, Colors::kNone},
            {{{"TERM", "xterm-256color"}}, Colors::k256},
            {{{"TERM", "tmux-256color"}, {"COLORTERM", "yes"}}, Colors::k256},
            {{{"TERM", "xterm-256color"}, {"COLORTERM", "truecolor"}}, Colors::kTrue},
            {{{"TERM", "xterm"}, {"COLORTERM", "24bit"}}, Colors::kTrue},
            {{{"TERM", "xterm-direct"}}, Colors::kTrue},
            {{{"TERM", "xterm-256color"}, {"NO_COLOR", "1"}}, Colors::kNone},
            {{{"TERM", "xterm-256color"}, {"NO_COLOR", ""}}, Colors::k256},
    };
    for (const auto& row : rows) {
        EXPECT_EQ(row.colors, colorsOf(in(row.variables)));
    }
}

TEST(TerminalTraits, TellWhetherUnicodeIsShown) {
    const struct {
        Variables variables;
        bool unicode;
    } rows[] = {
            {{}, false},
            {{{"LANG", "C"}}, false},
            {{{"LANG", "C.UTF-8"}}, true},
            {{{"LANG", "de_DE.utf8"}}, true},
            {{{"LANG", "C.UTF-8"}, {"LC_ALL", "C"}}, false},
            {{{"LANG", "C"}, {"LC_CTYPE", "en_US.UTF-8"}}, true},
            {{{"LANG", "C"}, {"LC_CTYPE", "en_US.UTF-8"}, {"LC_ALL", ""}}, true},
    };
    for (const auto& row : rows) {
        EXPECT_EQ(row.unicode, isUnicode(in(row.variables)));
    }
}

}  // namespace pemaro::zelkctl
