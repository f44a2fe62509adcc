// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <string>
#include <vector>

#include "tests/support/ChildProcess.h"

namespace pemaro::test {

using Words = std::vector<std::string>;

/// Runs zelkctl to its end.
RunResult zelkctl(Words arguments);

/// A command, its exit status, and all that it prints to stdout,
/// or to stderr (behind "zelkctl: ") when it fails.
struct Row {
    Words command;
    int status;
    std::string text;
};

/// Runs the commands one after another.
void expectRows(const std::vector<Row>& rows);

/// A folder for files of a test, gone with all of them when it ends.
class Files {
  public:
    Files();
    ~Files();
    Files(const Files&) = delete;
    Files& operator=(const Files&) = delete;

    const std::string& folder() const { return mFolder; }
    std::string path(const std::string& name) const { return mFolder + "/" + name; }
    /// Returns the path.
    std::string write(const std::string& name, const std::string& content) const;
    std::string read(const std::string& name) const;

  private:
    std::string mFolder = "/tmp/zelkctl.XXXXXX";
};

}  // namespace pemaro::test
