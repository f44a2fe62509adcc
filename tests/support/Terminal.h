// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <functional>
#include <string>
#include <vector>

#include "tests/support/ChildProcess.h"

namespace pemaro::test {

/// A terminal, which tmux plays, with a command in it; when that ends, "ended with" its status is
/// shown. It never outlives the object.
///
///     Terminal terminal("env TERM=vt100 zelkctl frames watch", 80, 40);
///     ASSERT_TRUE(terminal.awaitText("finger 2 at ")) << terminal.text();
class Terminal {
  public:
    /// A command line of the shell's, and how large the terminal is.
    Terminal(const std::string& command, int columns, int rows);
    ~Terminal();
    Terminal(const Terminal&) = delete;
    Terminal& operator=(const Terminal&) = delete;

    /// What stands there, with the escape sequences of colours or without.
    std::string text(bool withColors = false);

    /// Waits for what is to be shown; false when it does not come.
    bool await(const std::function<bool(const std::string&)>& shows);
    bool awaitText(const std::string& part);

    void resize(int columns, int rows);
    /// Ctrl-C.
    void interrupt();

  private:
    RunResult tmux(std::vector<std::string> words) const;

    const std::string mSocket;
};

}  // namespace pemaro::test
